#include "render/Viewer.h"

#include <algorithm>
#include <cfloat>
#include <cstdlib>

#include <osg/DisplaySettings>
#include <osg/Notify>
#include <osgDB/Registry>

#include "base/Paths.h"
#include "base/Text.h"
#include "host/Clock.h"
#include "host/ViewWindows.h"
#include "render/CompositeViewer.h"
#include "render/GpRenderer.h"

VtCRenderingGate renderingEnabled;

namespace
{

constexpr std::uint32_t pause = 100; // milliseconds between a change of views and the next frame

constexpr double nearPlane = 0.015;
constexpr double farPlane = 10000.0;
constexpr double portraitAngle = 40.0;
constexpr double landscapeAngle = 80.0;

constexpr unsigned int multisamples = 8;

/// All that the viewer keeps for the process.
struct Values
{
    VtTViewerServices services;
    osg::ref_ptr<VtCOsgCompositeViewer> viewer;
    osg::ref_ptr<osg::Stats> stats;
    osg::ref_ptr<osg::GraphicsContext> sharedContext;
    host::Window* sharedContextWindow = nullptr; ///< not owned
} values;

template <class Result>
Result Ask(const std::function<Result()>& function)
{
    return function ? function() : Result();
}

void Pause()
{
    if (values.services.clock)
        values.services.clock->Sleep(pause);
}

/// Fonts and other data are looked up beside the program.
void PublishModuleDirectory()
{
    if (values.services.moduleDirectory.empty())
        return;

    const std::string directory = base::NativePath(values.services.moduleDirectory).string();
    setenv("OSG_FILE_PATH", directory.c_str(), 1);
    // The library has read the variable already if anything was loaded before.
    osgDB::FilePathList& paths = osgDB::Registry::instance()->getDataFilePathList();
    if (std::find(paths.begin(), paths.end(), directory) == paths.end())
        paths.push_front(directory);
}

osg::ref_ptr<osg::GraphicsContext::Traits> MakeTraits()
{
    osg::ref_ptr<osg::GraphicsContext::Traits> traits = new osg::GraphicsContext::Traits;
    traits->x = 0;
    traits->y = 0;
    traits->width = 0;
    traits->height = 0;
    traits->windowDecoration = false;
    traits->doubleBuffer = true;
    traits->setInheritedWindowPixelFormat = true;
    traits->supportsResize = true;
    traits->useMultiThreadedOpenGLEngine = true;
    traits->red = traits->green = traits->blue = traits->alpha = 8;
    traits->depth = 24;
    traits->stencil = 8;
    if (Ask(values.services.multisampling))
        traits->samples = multisamples;
    return traits;
}

host::Rectangle UsedRectangle(const host::Rectangle& rectangle)
{
    host::Rectangle used = rectangle;
    if ((used.width <= 0 || used.height <= 0) && values.sharedContextWindow)
        used = values.sharedContextWindow->GetClientRectangle();
    used.width = std::max(1, used.width);
    used.height = std::max(1, used.height);
    return used;
}

void SetUpProjection(osg::Camera& camera, int width, int height)
{
    const double aspect = static_cast<double>(width) / height;
    double angle = portraitAngle;
    if (width < height)
        camera.setProjectionResizePolicy(osg::Camera::HORIZONTAL);
    else
    {
        camera.setProjectionResizePolicy(osg::Camera::VERTICAL);
        angle = landscapeAngle / aspect;
    }
    camera.setProjectionMatrixAsPerspective(angle, aspect, nearPlane, farPlane);
}

bool CardNeedsEmptyFrames()
{
    const std::wstring renderer = base::ToLower(base::Wide(Ask(values.services.cardRenderer)));
    return renderer.find(L"nvs") != std::wstring::npos || renderer.find(L"geforce") != std::wstring::npos;
}

void DrawWithoutScene(osgViewer::View& view, bool suspendIdle)
{
    {
        std::optional<VtCFrameSuspension> suspended;
        if (suspendIdle)
        {
            suspended.emplace();
            Pause();
        }
        const osg::ref_ptr<osg::Node> scene = view.getSceneData();
        view.setSceneData(nullptr);
        if (values.viewer)
            values.viewer->frame(DBL_MAX);
        view.setSceneData(scene.get());
    }
    if (suspendIdle)
        Pause();
}

} // namespace

void setViewerServices(VtTViewerServices newServices)
{
    values.services = std::move(newServices);
}

void createViewer()
{
    if (values.viewer)
        return;

    // The library tells of every file it tries at NOTICE.
    osg::setNotifyLevel(osg::WARN);
    PublishModuleDirectory();

    values.viewer = new VtCOsgCompositeViewer;
    values.stats = new osg::Stats("Glide Panel");
    values.stats->collectStats("frame_rate", true);
    values.viewer->setViewerStats(values.stats.get());
}

void destroyViewer()
{
    if (values.viewer)
    {
        if (values.viewer->areThreadsRunning())
            values.viewer->stopThreading();
        while (values.viewer->getNumViews() > 0)
        {
            const osg::ref_ptr<osgViewer::View> view = values.viewer->getView(0);
            view->setSceneData(nullptr);
            values.viewer->removeView(view.get());
        }
    }
    values.viewer = nullptr;
    values.sharedContext = nullptr;
    values.sharedContextWindow = nullptr;
}

VtCViewerReady::operator bool() const
{
    return values.viewer.valid();
}

VtCRenderingGate& VtCRenderingGate::operator=(bool flag)
{
    if (flag)
        own.reset();
    else if (!own)
        own.emplace(VtCFrameSuspension::Extent::pictures);
    return *this;
}

osg::Stats* getViewerStats()
{
    return values.stats.get();
}

osgViewer::CompositeViewer* getViewer()
{
    return values.viewer.get();
}

void createSharedContext(host::Window& window)
{
    values.sharedContextWindow = &window;
    const osg::ref_ptr<osg::GraphicsContext::Traits> traits = MakeTraits();
    values.sharedContext = values.services.graphics
                               ? values.services.graphics->CreateContext({host::WindowKind::root, window, *traits})
                               : nullptr;
}

osg::GraphicsContext* getSharedContext()
{
    return values.sharedContext.get();
}

osg::ref_ptr<osg::GraphicsContext> createViewContext(host::ViewWindow& window)
{
    if (!values.services.graphics)
        return nullptr;

    const host::Rectangle client = window.GetClientRectangle();
    const osg::ref_ptr<osg::GraphicsContext::Traits> traits = MakeTraits();
    traits->width = client.width;
    traits->height = client.height;
    traits->sharedContext = values.sharedContext.get();
    return values.services.graphics->CreateContext({window.GetKind(), window, *traits});
}

osg::ref_ptr<osgViewer::View> createView(host::ViewWindow& window, const host::Rectangle& rectangle)
{
    osg::ref_ptr<osgViewer::View> view = new osgViewer::View;
    osg::ref_ptr<osg::DisplaySettings> settings = new osg::DisplaySettings;
    settings->setDefaults();
    settings->setDisplayType(osg::DisplaySettings::MONITOR);
    settings->setDepthBuffer(true);
    settings->setStereo(false);
    settings->setDoubleBuffer(true);

    osg::Camera& camera = *view->getCamera();
    camera.setRenderer(new VtCOsgGpRenderer(&camera));
    camera.setClearMask(GL_COLOR_BUFFER_BIT | GL_DEPTH_BUFFER_BIT | GL_STENCIL_BUFFER_BIT);
    camera.setClearStencil(0);
    camera.setComputeNearFarMode(osg::CullSettings::DO_NOT_COMPUTE_NEAR_FAR);
    camera.setDisplaySettings(settings.get());
    camera.setGraphicsContext(createViewContext(window).get());

    const host::Rectangle used = UsedRectangle(rectangle);
    camera.setViewport(0, 0, used.width, used.height);
    SetUpProjection(camera, used.width, used.height);
    return view;
}

void addViewToViewer(osgViewer::View* view)
{
    if (view && viewerReady)
        values.viewer->AddView(*view);
}

void removeViewFromViewer(osgViewer::View* view)
{
    if (view && viewerReady)
        values.viewer->RemoveView(*view);
}

bool isViewInViewer(const osgViewer::View* view)
{
    if (!values.viewer)
        return false;
    for (unsigned int index = 0; index < values.viewer->getNumViews(); ++index)
        if (values.viewer->getView(index) == view)
            return true;
    return false;
}

void RenderViewerFrame()
{
    if (renderingEnabled && viewerReady)
        values.viewer->frame(
            DBL_MAX); // the simulation time of the frame is the viewer's own clock, not that of the data
}

bool isViewerFrameDue()
{
    return renderingEnabled && viewerReady && values.viewer->checkNeedToDoFrame();
}

void requestViewerRedraw()
{
    if (values.viewer)
        values.viewer->RequestRedraw();
}

void renderEmptyFrame(bool suspendIdle)
{
    osgViewer::View* view = Ask(values.services.activeView);
    if (view && Ask(values.services.hasScene) && CardNeedsEmptyFrames())
        DrawWithoutScene(*view, suspendIdle);
}

void renderEmptyFrameOfView(osgViewer::View* view, bool suspendIdle)
{
    if (view && CardNeedsEmptyFrames())
        DrawWithoutScene(*view, suspendIdle);
}

double getFrameRate()
{
    double value = 0.0;
    if (values.stats && !values.stats->getAveragedAttribute("Frame rate", value, false))
        value = 0.0;
    return value;
}

std::int32_t getVisiblePolygonCount(osgViewer::View* view, std::int32_t polygonCount)
{
    osg::Stats* stats = view ? view->getCamera()->getStats() : nullptr;
    if (!stats)
        return polygonCount;

    // Each change of what is collected stands between two pauses, with nothing drawn in the first.
    const auto collect = [stats](bool flag)
    {
        {
            const VtCFrameSuspension undrawn(VtCFrameSuspension::Extent::pictures);
            Pause();
            stats->collectStats("scene", flag);
        }
        Pause();
    };
    collect(true);
    RenderViewerFrame();
    const std::int32_t counted = SumPolygons(*stats);
    collect(false);
    return counted;
}
