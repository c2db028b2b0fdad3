#pragma once

#include <memory>
#include <optional>

#include "base/FrameSuspension.h"
#include "render/Base3DView.h"
#include "render/SplitterEx.h"

namespace host
{
class ChildFrameWindow;
class Clock;
class Selection;
class ViewWindows;
} // namespace host
class VtCMouseInputManager;
class VtCRecordBuilders;
class VtCVisualizationViewCommandsHandler;

/// What a child frame needs of the application.
struct VtTChildFrameServices
{
    VtISceneDocument& document;
    VtC3DObservers& observers;
    VtIInteractionServices& interaction;
    VtCMouseInputManager& mouseInputManager;
    host::ViewWindows& windows;
    host::Selection& selection;
    host::Clock& clock;
};

/// The frame of one scene: its window with the grid of views, and which of them is active.
///
/// The windows come first and are drawn to only when the creation timer has fired; until then rendering is held back.
/// Gone before the document's observers and scene.
class VtCChildFrame : public VtIViewFrame
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
    void ObserverAssigned(const VtCBase3DView& view) override;
    void SelectBody(const VtC3DBody& body) override;
    void ApplyLayout(std::int32_t layout) override;
    std::int32_t GetLayout() const override { return splitter->getLayout(); }

    // Stored records (`RegisterViewRecords`).

    /// The view of pane 1 to 4 takes the values of `record` and then the record itself, which the store holds under
    /// `id`. Nothing for other panes.
    void ApplyViewRecord(std::int32_t pane, VtISceneObject& record, const std::wstring& id);

    /// The splitter takes over the layout record that the store holds under `id`, and its position.
    void ApplyLayoutRecord(const std::wstring& id) { splitter->ApplyLayoutRecord(id); }

    /// Marks the observer of the active view as looked through, and takes the head light there.
    void ActivateObserver();

private:
    void GiveDefaultObservers();
    void CreateViews();
    void Pause() const;

    VtTChildFrameServices services;
    std::optional<VtCFrameSuspension> undrawn{VtCFrameSuspension::Extent::pictures}; ///< until the views are made
    std::unique_ptr<VtCVisualizationViewCommandsHandler> commands;
    std::unique_ptr<host::ChildFrameWindow> window;
    VtCBase3DView* activeView = nullptr;
    std::unique_ptr<VtCSplitterEx> splitter;
    bool viewsCreated = false;
    bool frameHidden = false;
};

/// The builders of views and window layout. `frame` outlives `builders`.
void RegisterViewRecords(VtCRecordBuilders& builders, VtCChildFrame& frame);
