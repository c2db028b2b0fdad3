#include "render/CompositeViewer.h"

#include <algorithm>
#include <string_view>

#include <osg/GL>
#include <osg/GLExtensions>
#include <osg/Stats>
#include <osgGA/CameraManipulator>

VtCOsgCompositeViewer::VtCOsgCompositeViewer()
{
    setThreadingModel(SingleThreaded);
    setUseConfigureAffinity(false);
    setKeyEventSetsDone(0);
    setQuitEventSetsDone(false);
    setRunFrameScheme(ON_DEMAND);
}

void VtCOsgCompositeViewer::AddView(osgViewer::View& view)
{
    addView(&view);
    if (started)
        GiveStartTick(view);
}

void VtCOsgCompositeViewer::RemoveView(osgViewer::View& view)
{
    if (getViewWithFocus() == &view)
        setCameraWithFocus(nullptr);
    std::erase(_views, &view);
    probe->removeChildren(0, probe->getNumChildren()); // it isn't to keep the scene of a view that is gone
    _requestContinousUpdate = false;                   // a drag in that view doesn't end any more
}

bool VtCOsgCompositeViewer::checkNeedToDoFrame()
{
    const bool due = CompositeViewer::checkNeedToDoFrame() || LooksDifferent();
    rested = rested || !due;
    return due;
}

bool VtCOsgCompositeViewer::checkEvents()
{
    return std::any_of(_views.begin(), _views.end(),
                       [](const osg::ref_ptr<osgViewer::View>& view) { return !view->getEventQueue()->empty(); });
}

void VtCOsgCompositeViewer::frame(double simulationTime)
{
    CollectContexts();
    if (contexts.empty())
    {
        rested = true;
        return;
    }
    setDone(false);
    RealiseContexts();
    if (!started)
    {
        started = true;
        setStartTick(osg::Timer::instance()->tick());
        for (const osg::ref_ptr<osgViewer::View>& view : _views)
            GiveStartTick(*view);
    }
    CompositeViewer::frame(simulationTime);
}

void VtCOsgCompositeViewer::advance(double simulationTime)
{
    osg::Stats* stats = getViewerStats();
    const bool counts = stats && stats->collectStats("frame_rate");
    if (counts && rested)
        stats->collectStats("frame_rate", false);
    CompositeViewer::advance(simulationTime);
    if (counts && rested)
        stats->collectStats("frame_rate", true);
    rested = false;
}

void VtCOsgCompositeViewer::renderingTraversals()
{
    // From here on a change belongs to the next picture.
    RememberLooks();
    CompositeViewer::renderingTraversals();
}

VtCOsgCompositeViewer::Look VtCOsgCompositeViewer::Look::Of(const osgViewer::View& view)
{
    const osg::Camera& camera = *view.getCamera();
    const osgGA::CameraManipulator* manipulator = view.getCameraManipulator();
    const osg::Viewport* viewport = camera.getViewport();
    const osg::GraphicsContext* context = camera.getGraphicsContext();
    return {.view = &view,
            .context = context && context->valid() ? context : nullptr,
            .scene = view.getSceneData(),
            .camera = manipulator ? manipulator->getInverseMatrix() : camera.getViewMatrix(),
            .projection = camera.getProjectionMatrix(),
            .viewport = viewport ? osg::Vec4d(viewport->x(), viewport->y(), viewport->width(), viewport->height())
                                 : osg::Vec4d(),
            .clearColour = camera.getClearColor()};
}

bool VtCOsgCompositeViewer::LooksDifferent() const
{
    return probe->HasMoved() || !std::equal(_views.begin(), _views.end(), looks.begin(), looks.end(),
                                            [](const osg::ref_ptr<osgViewer::View>& view, const Look& look)
                                            { return Look::Of(*view) == look; });
}

void VtCOsgCompositeViewer::RememberLooks()
{
    looks.clear();
    for (const osg::ref_ptr<osgViewer::View>& view : _views)
        looks.push_back(Look::Of(*view));

    const auto watches = [this](const osg::Node* scene) { return !scene || probe->containsNode(scene); };
    const auto shows = [this](const osg::Node* scene)
    { return std::any_of(looks.begin(), looks.end(), [&](const Look& look) { return look.scene == scene; }); };
    bool same = std::all_of(looks.begin(), looks.end(), [&](const Look& look) { return watches(look.scene); });
    for (unsigned int child = 0; child < probe->getNumChildren(); ++child)
        same = same && shows(probe->getChild(child));
    if (!same)
    {
        probe->removeChildren(0, probe->getNumChildren());
        for (const osg::ref_ptr<osgViewer::View>& view : _views)
            if (osg::Node* scene = view->getSceneData(); !watches(scene))
                probe->addChild(scene);
    }
    probe->getBound();
}

void VtCOsgCompositeViewer::CollectContexts()
{
    contexts.clear();
    for (const osg::ref_ptr<osgViewer::View>& view : _views)
        if (osg::GraphicsContext* context = view->getCamera()->getGraphicsContext();
            context && context->valid() && std::find(contexts.begin(), contexts.end(), context) == contexts.end())
            contexts.push_back(context);
}

void VtCOsgCompositeViewer::RealiseContexts()
{
    for (osg::GraphicsContext* context : contexts)
        if (!context->isRealized())
        {
            context->realize();
            adaptToSoftwareRenderer(*context);
        }
}

void VtCOsgCompositeViewer::GiveStartTick(osgViewer::View& view)
{
    view.setStartTick(_startTick);
    // Events of a queue with another start would lie in the future or the past of the frame that takes them.
    view.getEventQueue()->setStartTick(_startTick);
}

void adaptToSoftwareRenderer(osg::GraphicsContext& context)
{
    if (!context.makeCurrent())
        return;
    const auto* text = reinterpret_cast<const char*>(glGetString(GL_RENDERER));
    const std::string_view renderer = text ? text : "";
    for (const char* software : {"llvmpipe", "softpipe", "swrast"})
        if (renderer.find(software) != std::string_view::npos)
            context.getState()->get<osg::GLExtensions>()->isTextureFilterAnisotropicSupported = false;
    context.releaseContext();
}
