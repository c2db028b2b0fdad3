#include "render/GpRenderer.h"

#include <mutex>

#include <osg/Stats>
#include <osgViewer/View>

#include "render/SceneView.h"
#include "render/Statistics.h"

namespace
{

std::mutex drawDispatch;

} // namespace

VtCOsgGpRenderer::VtCOsgGpRenderer(osg::Camera* camera) : osgViewer::Renderer(camera)
{
    // The queues hold plain pointers, so the exchanged scene view has to be exchanged there too.
    _sceneView[0] = new VtCOsgSceneView(*_sceneView[0]);
    _availableQueue._queue.clear();
    _availableQueue.add(_sceneView[0].get());
    _availableQueue.add(_sceneView[1].get());
}

void VtCOsgGpRenderer::cull_draw()
{
    osgUtil::SceneView* sceneView = _sceneView[0].get();
    if (!sceneView || _done)
        return;

    updateSceneView(sceneView);
    if (_compileOnNextDraw)
        compile();

    if (auto* view = dynamic_cast<osgViewer::View*>(_camera->getView()))
        sceneView->setFusionDistance(view->getFusionDistanceMode(), view->getFusionDistanceValue());

    osg::Stats* stats = sceneView->getCamera()->getStats();
    osg::State* state = sceneView->getState();
    const unsigned int frameNumber = state->getFrameStamp() ? state->getFrameStamp()->getFrameNumber() : 0;
    if (!_initialized)
        initialize(state);

    const bool wantsGpu = stats && _querySupport.valid() && stats->collectStats("gpu");
    if (wantsGpu)
        _querySupport->checkQuery(stats, state, _startTick);

    const osg::Timer& timer = *osg::Timer::instance();
    const osg::Timer_t beforeCull = timer.tick();
    sceneView->inheritCullSettings(*sceneView->getCamera());
    sceneView->cull();
    const osg::Timer_t afterCull = timer.tick();

    if (stats && stats->collectStats("scene"))
        CollectSceneStatistics(frameNumber, *sceneView, *stats);

    if (wantsGpu)
    {
        _querySupport->checkQuery(stats, state, _startTick);
        _querySupport->beginQuery(frameNumber, state);
    }

    osg::Timer_t beforeDraw;
    const osg::DisplaySettings* settings = sceneView->getDisplaySettings();
    if (settings && settings->getSerializeDrawDispatch())
    {
        const std::lock_guard<std::mutex> lock(drawDispatch);
        beforeDraw = timer.tick();
        sceneView->draw();
    }
    else
    {
        beforeDraw = timer.tick();
        sceneView->draw();
    }

    if (wantsGpu)
    {
        _querySupport->endQuery(state);
        _querySupport->checkQuery(stats, state, _startTick);
    }

    const osg::Timer_t afterDraw = timer.tick();
    if (stats && stats->collectStats("rendering"))
    {
        stats->setAttribute(frameNumber, "Cull traversal begin time", timer.delta_s(_startTick, beforeCull));
        stats->setAttribute(frameNumber, "Cull traversal end time", timer.delta_s(_startTick, afterCull));
        stats->setAttribute(frameNumber, "Cull traversal time taken", timer.delta_s(beforeCull, afterCull));
        stats->setAttribute(frameNumber, "Draw traversal begin time", timer.delta_s(_startTick, beforeDraw));
        stats->setAttribute(frameNumber, "Draw traversal end time", timer.delta_s(_startTick, afterDraw));
        stats->setAttribute(frameNumber, "Draw traversal time taken", timer.delta_s(beforeDraw, afterDraw));
    }
}
