#pragma once

#include <vector>

#include <osg/GraphicsContext>
#include <osg/Group>
#include <osgViewer/CompositeViewer>
#include <osgViewer/View>

/// The viewer of all panes, for a program that has its own windows and event loop.
///
/// Its traversals, its cull and its draw are the library's: own versions of them made no picture cheaper
/// (docs/decisions.md). It differs where a component must do otherwise than a program of the library's own:
/// - It opens no window, and a frame without a valid context does nothing. The library's viewer would open a
///   fullscreen window, or declare itself done and never draw again.
/// - Contexts that come later are realised with the next frame, and views that come later share its clock.
/// - A view that leaves keeps its context. `removeView` would close that for good.
/// - The processor affinity of the thread stays as it is.
/// - It can tell whether the next picture would differ from the last (`checkNeedToDoFrame`), so that one that wouldn't
///   needn't be drawn: the library's scheme of frames on demand, which in the library knows of events, callbacks and
///   requests only. Here it sees by itself that a camera, a viewport, a window or a scene is another one, and that
///   something in a scene has moved, come or gone. What changes colours, lights or visibility calls `RequestRedraw`.
/// - A frame after a rest has no frame rate: the time since the last one is not what it took.
///
/// Single threaded: everything happens within `frame` on the calling thread.
class VtCOsgCompositeViewer : public osgViewer::CompositeViewer
{
public:
    VtCOsgCompositeViewer();

    /// Like `addView`; a view that joins a running viewer also gets its start tick.
    void AddView(osgViewer::View& view);

    /// Takes the view out as it is.
    void RemoveView(osgViewer::View& view);

    /// Makes the next frame due, as the `requestRedraw` of one of the views does.
    void RequestRedraw() { _requestRedraw = true; }

    /// Is a frame due? When it isn't, the one after it begins a new run of frames for the frame rate.
    bool checkNeedToDoFrame() override;

    /// Input that waits in the queue of a view; the windows, which are the host's, raise no events.
    bool checkEvents() override;

    void frame(double simulationTime) override;
    void advance(double simulationTime) override;
    void renderingTraversals() override;

protected:
    ~VtCOsgCompositeViewer() override = default;

private:
    /// What the picture of one view hangs on beside its scene.
    struct Look
    {
        const osgViewer::View* view;
        const osg::GraphicsContext* context; ///< null while it can't be drawn to
        const osg::Node* scene;
        osg::Matrixd camera;
        osg::Matrixd projection;
        osg::Vec4d viewport;
        osg::Vec4f clearColour;

        static Look Of(const osgViewer::View& view);
        bool operator==(const Look&) const = default;
    };

    /// Hangs above the scenes: whatever changes the bound of something below dirties its own.
    class SceneProbe : public osg::Group
    {
    public:
        bool HasMoved() const { return !_boundingSphereComputed; }
    };

    bool LooksDifferent() const;
    void RememberLooks();
    void CollectContexts();
    void RealiseContexts();
    void GiveStartTick(osgViewer::View& view);

    bool started = false;
    bool rested = true;                          ///< no frame before the next one, or a rest between them
    std::vector<osg::GraphicsContext*> contexts; ///< valid ones, each once; good for one frame
    std::vector<Look> looks;                     ///< as last drawn
    osg::ref_ptr<SceneProbe> probe = new SceneProbe;
};

/// Turns off what a renderer without a graphics card can't do in bearable time, for all contexts that share the id of
/// `context`. Nothing on a graphics card. Call once `context` is realised.
///
/// Mesa's software renderer takes seconds for a frame with anisotropic filtering, and some views of a textured road
/// never end (Mesa 22.3: the generated loop over the samples doesn't stop).
void adaptToSoftwareRenderer(osg::GraphicsContext& context);
