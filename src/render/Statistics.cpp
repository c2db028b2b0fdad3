#include "render/Statistics.h"

#include <osg/Stats>
#include <osgUtil/SceneView>
#include <osgUtil/Statistics>

#include "render/RenderStage.h"

namespace
{

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

} // namespace

void CollectSceneStatistics(unsigned int frameNumber, osgUtil::SceneView& sceneView, osg::Stats& stats)
{
    osgUtil::Statistics counted;
    sceneView.getStats(counted);
    if (const auto* stage = dynamic_cast<VtCOsgRenderStage*>(sceneView.getRenderStage()))
        counted.addBins(-stage->CountEmptyBins());

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
