#pragma once

#include <functional>
#include <memory>

#include "render/Base3DView.h"
#include "render/SplitterEx.h"
#include "scene/SceneParts.h"

namespace host
{
class ChildFrameWindow;
class Clock;
class ViewWindows;
} // namespace host
class VtCMouseInputManager;
class VtCVisualizationViewCommandsHandler;

/// What a child frame needs of the application.
struct VtTChildFrameServices
{
    VtISceneDocument& document;
    VtC3DObservers& observers;
    VtIInteractionServices& interaction;
    VtCMouseInputManager& mouseInputManager;
    host::ViewWindows& windows;
    host::Clock& clock;
    std::function<void()> disconnectIdle; ///< suspends the frame cycle
    std::function<void()> connectIdle;    ///< resumes it
};

/// The frame of one scene: its window with the grid of views, and which of them is active.
///
/// The windows come first and are drawn to only when the creation timer has fired; until then rendering is held back.
/// Gone before the document's observers and scene.
class VtCChildFrame : public VtIViewFrame, public VtISceneViews
{
public:
    explicit VtCChildFrame(VtTChildFrameServices frameServices);
    ~VtCChildFrame() override;
    VtCChildFrame(const VtCChildFrame&) = delete;
    VtCChildFrame& operator=(const VtCChildFrame&) = delete;

    VtCSplitterEx& getSplitter() const { return *splitter; }
    host::ChildFrameWindow& getWindow() const { return *window; }
    VtCVisualizationViewCommandsHandler& getCommands() const { return *commands; }

    /// Starts the timer that makes the four views, 250 milliseconds from now.
    void startViewCreation();

    /// Has the timer fired, so that the views can be drawn?
    bool areViewsCreated() const { return viewsCreated; }

    // To all four views.

    void setClearColor(int red, int green, int blue);
    void setFarClipPlane(float distance);
    void assignObserver(const VtC3DObserver& old, VtC3DObserver& substitute);

    /// The active view if it is one of the panes; null otherwise.
    VtCPanoramicView* GetActivePane() const;

    /// Is it the active view's own, or one that the active view's manipulator drives, as that over a whole screen is?
    bool IsActiveView(const osgViewer::View* view) const;

    /// Whom the active view looks through; null without one.
    const VtC3DObserver* GetActiveObserver() const;

    /// Hides the panes while an editor shows the picture in windows of its own, and shows them again.
    void SetFrameHidden(bool flag);
    bool IsFrameHidden() const { return frameHidden; }

    VtISceneDocument& GetDocument() const override { return services.document; }
    VtC3DObservers* GetObservers() const override { return &services.observers; }
    VtIInteractionServices& GetInteraction() const override { return services.interaction; }
    int countViewsOfObserver(const VtC3DObserver& observer) const override;
    void activateView(VtCBase3DView& view) override;
    VtCBase3DView* GetActiveView() const override { return activeView; }
    void ForgetView(const VtCBase3DView& view) override;
    void SelectBody(const VtC3DBody& body) override;
    void ApplyLayout(std::int32_t layout) override;

    void ApplyViewRecord(std::int32_t pane, VtISceneObject& record, const std::wstring& id) override;
    void ApplyLayoutRecord(const std::wstring& id) override { splitter->ApplyLayoutRecord(id); }
    void ActivateObserver() override;

private:
    void GiveDefaultObservers();
    void CreateViews();
    void Pause() const;

    VtTChildFrameServices services;
    std::unique_ptr<VtCVisualizationViewCommandsHandler> commands;
    std::unique_ptr<host::ChildFrameWindow> window;
    VtCBase3DView* activeView = nullptr;
    std::unique_ptr<VtCSplitterEx> splitter;
    bool viewsCreated = false;
    bool frameHidden = false;
};
