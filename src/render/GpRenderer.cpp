#include "render/GpRenderer.h"

#include <mutex>

#include <osg/Stats>
#include <osgUtil/Statistics>
#include <osgViewer/View>

namespace
{

std::mutex drawDispatch;

struct PrimitiveKind
{
    GLenum mode;
    const char* name;
};

constexpr PrimitiveKind primitiveKinds[] = {
    {GL_POINTS, "Visible number of GL_POINTS"},
    {GL_LINES, "Visible number of GL_LINES"},
    {GL_LINE_STRIP, "Visible number of GL_LINE_STRIP"},
    {GL_LINE_LOOP, "Visible number of GL_LINE_LOOP"},
    {GL_TRIANGLES, "Visible number of GL_TRIANGLES"},
    {GL_TRIANGLE_STRIP, "Visible number of GL_TRIANGLE_STRIP"},
    {GL_TRIANGLE_FAN, "Visible number of GL_TRIANGLE_FAN"},
    {GL_QUADS, "Visible number of GL_QUADS"},
    {GL_QUAD_STRIP, "Visible number of GL_QUAD_STRIP"},
    {GL_POLYGON, "Visible number of GL_POLYGON"},
};

constexpr const char* polygonNames[] = {
    "Visible number of GL_POLYGON",    "Visible number of GL_QUADS",        "Visible number of GL_TRIANGLES",
    "Visible number of GL_QUAD_STRIP", "Visible number of GL_TRIANGLE_FAN", "Visible number of GL_TRIANGLE_STRIP",
};

void CollectSceneStatistics(unsigned int frameNumber, osgUtil::SceneView& sceneView, osg::Stats& stats)
{
    osgUtil::Statistics counted;
    sceneView.getStats(counted);

    const auto set = [&](const char* name, unsigned int value)
    { stats.setAttribute(frameNumber, name, static_cast<double>(value)); };
    const auto unsignedCount = [](auto value) { return static_cast<unsigned int>(value); };
    set("Visible vertex count", unsignedCount(counted._vertexCount));
    set("Visible number of drawables", unsignedCount(counted.numDrawables));
    set("Visible number of lights", unsignedCount(counted.nlights));
    set("Visible number of render bins", unsignedCount(counted.nbins));
    set("Visible depth", unsignedCount(counted.depth));
    set("Number of StateGraphs", unsignedCount(counted.numStateGraphs));
    set("Visible number of impostors", unsignedCount(counted.nimpostor));
    set("Number of ordered leaves", unsignedCount(counted.numOrderedLeaves));

    unsigned int primitiveSets = 0;
    for (const auto& [mode, pair] : counted.getPrimitiveValueMap())
        primitiveSets += pair.first;
    set("Visible number of PrimitiveSets", primitiveSets);

    for (const PrimitiveKind& kind : primitiveKinds)
        set(kind.name, unsignedCount(counted.getPrimitiveCountMap()[kind.mode]));
}

} // namespace

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

std::int32_t SumPolygons(const osg::Stats& stats)
{
    const unsigned int frame = stats.getLatestFrameNumber();
    double sum = 0.0;
    for (const char* name : polygonNames)
    {
        double count = 0.0;
        if (stats.getAttribute(frame, name, count))
            sum += count;
    }
    return static_cast<std::int32_t>(sum);
}
