#pragma once

#include <functional>
#include <memory>

#include "render/SplitterEx.h"
#include "render/ViewFrame.h"
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

    /// What the layout commands do: the layout, an active view that can be seen, an empty frame for cards that want
    /// one.
    void ApplyLayout(std::int32_t layout);

    /// Hides the panes while an editor shows the picture in windows of its own, and shows them again.
    void SetFrameHidden(bool flag);
    bool IsFrameHidden() const { return frameHidden; }

    VtISceneDocument& GetDocument() const override { return services.document; }
    VtC3DObservers* GetObservers() const override { return &services.observers; }
    VtIInteractionServices& GetInteraction() const override { return services.interaction; }
    int countViewsOfObserver(const VtC3DObserver& observer) const override;
    void activateView(VtCPanoramicView& view) override;
    VtCPanoramicView* GetActiveView() const override { return activeView; }
    void SelectBody(const VtC3DBody& body) override;
    void ShowSingleView() override { ApplyLayout(layoutSingle); }

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
    VtCPanoramicView* activeView = nullptr;
    std::unique_ptr<VtCSplitterEx> splitter;
    bool viewsCreated = false;
    bool frameHidden = false;
};
