#pragma once

#include <cstdint>
#include <functional>
#include <optional>
#include <string>

#include <osg/GraphicsContext>
#include <osg/ref_ptr>
#include <osg/Stats>
#include <osgViewer/View>

#include "base/FrameSuspension.h"
#include "host/Graphics.h"

namespace host
{
class Clock;
class ViewWindow;
} // namespace host

namespace osgViewer
{
class CompositeViewer;
} // namespace osgViewer

/// The one viewer of the process: free functions over one object that nobody else sees, all on the thread that owns the
/// windows.
///
/// Order of use: `setViewerServices` once; then for each document `createViewer`, `createSharedContext`, `createView`
/// for each pane, `addViewToViewer`; once an idle pass `RenderViewerFrame` if `isViewerFrameDue`; `destroyViewer` with
/// the document.

/// What the viewer needs from outside. Functions that are left empty count as "nothing" or "no".
struct VtTViewerServices
{
    host::Graphics* graphics = nullptr; ///< makes the contexts; null: every view stays black
    host::Clock* clock = nullptr;       ///< makes the pauses around changes of views; null: none
    std::wstring moduleDirectory;       ///< folder of the program, inner form with a trailing backslash, or empty

    std::function<bool()> multisampling;          ///< the host's multisampling setting
    std::function<std::string()> cardRenderer;    ///< the renderer string of the graphics card, empty until known
    std::function<bool()> hasScene;               ///< does the application have a scene?
    std::function<osgViewer::View*()> activeView; ///< the view of the active pane, or null
};

/// Set by the application object before anything else here; an empty one at its end.
void setViewerServices(VtTViewerServices services);

/// True from the end of `createViewer` to `destroyViewer`.
class VtCViewerReady
{
public:
    operator bool() const;
};
inline constexpr VtCViewerReady viewerReady;

/// The gate of `RenderViewerFrame` by its name: true while no suspension holds the pictures up. False as a value holds
/// one such suspension, and true gives that one up, not those of others. A stretch of code takes a suspension of its
/// own instead.
class VtCRenderingGate
{
public:
    operator bool() const { return !VtCFrameSuspension::ArePicturesSuspended(); }
    VtCRenderingGate& operator=(bool flag);

private:
    std::optional<VtCFrameSuspension> own;
};
extern VtCRenderingGate renderingEnabled;

/// The viewer's statistics, "Glide Panel"; null before the first `createViewer`. Not owned.
osg::Stats* getViewerStats();

/// Does nothing while there is a viewer.
void createViewer();

/// Takes the scenes out of the views and the views out of the viewer, and drops viewer and shared context. The panes
/// still own their views afterwards.
void destroyViewer();

/// The viewer, or null. Not owned.
osgViewer::CompositeViewer* getViewer();

/// Makes the root context, with which all view contexts share their objects, and remembers `window`, which stays
/// alive as long as views are created.
void createSharedContext(host::Window& window);

/// The root context; null before `createSharedContext`, or when the platform refused.
osg::GraphicsContext* getSharedContext();

/// A context that draws to `window` in its present size, of the window's kind. Null when the platform refuses; the
/// host's graphics then know why. A context isn't resized: a window of another size takes a new one.
osg::ref_ptr<osg::GraphicsContext> createViewContext(host::ViewWindow& window);

/// A view for `window` with its renderer, camera and context, not yet in the viewer. Its viewport has the size of
/// `rectangle`; if that is empty, of the window on which the shared context was made. The field of view is 80 degrees
/// across in a landscape window (the height follows) and 40 degrees upright in a portrait one.
osg::ref_ptr<osgViewer::View> createView(host::ViewWindow& window, const host::Rectangle& rectangle);

/// Both do nothing for null, or while `viewerReady` is false. A view out of the viewer keeps its camera and context.
void addViewToViewer(osgViewer::View* view);
void removeViewFromViewer(osgViewer::View* view);

bool isViewInViewer(const osgViewer::View* view);

/// Draws one frame of all views, if there is a viewer and rendering is enabled.
void RenderViewerFrame();

/// Would the next frame show something else than the last? The viewer sees by itself what moves, comes or goes in a
/// scene, and what happens to cameras, panes and windows; input and animations count too. False while nothing can be
/// drawn.
bool isViewerFrameDue();

/// Makes the next frame due: something has changed that the viewer doesn't see by itself, as a colour or a light.
void requestViewerRedraw();

/// Some drivers let go of a scene only when they have drawn without it: one frame of the active view with no scene,
/// when a scene is present and the card is one of those. With `suspendIdle` the idle cycle rests meanwhile.
void renderEmptyFrame(bool suspendIdle);

/// The same for the view of one pane; null does nothing.
void renderEmptyFrameOfView(osgViewer::View* view, bool suspendIdle);

/// Frames per second, averaged over the last 25; 0.0 before there were two in a row. A rest between two frames doesn't
/// count, and while nothing is drawn the value stays.
double getFrameRate();

/// Polygons that one more frame finds in sight of `view`; `polygonCount`, the count before, when there is no view.
/// Takes half a second of pauses. 0 while the pictures are suspended.
std::int32_t getVisiblePolygonCount(osgViewer::View* view, std::int32_t polygonCount);
