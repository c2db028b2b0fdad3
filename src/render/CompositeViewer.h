#pragma once

#include <list>
#include <vector>

#include <osgViewer/CompositeViewer>
#include <osgViewer/View>

class VtCOsgViewerStats;

/// The viewer of all panes, for a program that has its own windows and event loop.
///
/// It differs from the library's viewer in what a component must not do, and in what a frame costs:
/// - It opens no window of its own, and a frame without a valid context does nothing. The library's viewer would open
///   a fullscreen window, or declare itself done and never draw again.
/// - Contexts that come later are realised with the next frame, and views that come later share its clock.
/// - The processor affinity of the thread stays as it is.
/// - A frame without input events takes nothing from the heap. The containers of the traversals are kept, and each
///   view has one frame event that is sent again and again; a handler that keeps a reference on it gets the next
///   frame in a new one. With input events, or with statistics other than "frame_rate" switched on, the library's
///   own traversals run.
///
/// Single threaded: everything happens within `frame` on the calling thread.
class VtCOsgCompositeViewer : public osgViewer::CompositeViewer
{
public:
    VtCOsgCompositeViewer();

    /// Like `addView`; a view that joins a running viewer also gets its start tick.
    void AddView(osgViewer::View& view);

    /// Takes the view out as it is. The library's `removeView` would close its context, for good.
    void RemoveView(osgViewer::View& view);

    void SetStats(VtCOsgViewerStats& newStats);

    void frame(double simulationTime) override;
    void realize() override;
    void advance(double simulationTime) override;
    void eventTraversal() override;
    void updateTraversal() override;
    void renderingTraversals() override;

protected:
    ~VtCOsgCompositeViewer() override = default;

private:
    /// The frame event of one view, in the one-element list that the event visitor takes.
    struct FrameEvent
    {
        osgViewer::View* view;
        osgGA::EventQueue::Events event;
    };

    void CollectContexts();
    void CollectScenes();
    void GiveStartTick(osgViewer::View& view);
    bool HasInput();
    bool Collects(const char* statistic) const;
    FrameEvent& PrepareFrameEvent(std::size_t index);
    void SendFrameEvent(FrameEvent& frameEvent);
    void UpdateView(osgViewer::View& view);
    void DrawContext(osg::GraphicsContext& context);

    VtCOsgViewerStats* frameStats = nullptr; ///< kept alive by the base class
    bool started = false;
    std::vector<osg::GraphicsContext*> contexts; ///< valid ones, in the order of their views; good for one frame
    std::vector<osgViewer::Scene*> scenes;       ///< likewise
    std::vector<FrameEvent> frameEvents;
};
