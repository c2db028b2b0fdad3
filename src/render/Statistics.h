#pragma once

#include <cstdint>

namespace osg
{
class Stats;
} // namespace osg

namespace osgUtil
{
class SceneView;
} // namespace osgUtil

/// Counts what the last cull of `sceneView` found and stores the counts in `stats` under `frameNumber`: vertices,
/// drawables, lights, bins, state graphs, primitive sets, and the primitives of each kind. Costs a traversal of the
/// render graph, so it runs only in frames that want it.
void CollectSceneStatistics(unsigned int frameNumber, osgUtil::SceneView& sceneView, osg::Stats& stats);

/// Polygons of the latest frame in `stats`: those kinds of primitives that have an area. 0 for a frame without counts.
std::int32_t SumPolygons(const osg::Stats& stats);
