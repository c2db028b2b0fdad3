#pragma once

#include <cstdint>

#include <osgViewer/Renderer>

/// The renderer of a view's camera: the library's in single-threaded mode, which beside drawing collects the
/// statistics that the camera's `osg::Stats` asks for. The library's renderer collects "scene" only where cull and draw
/// run apart; here both run in one call, so that is made up for:
///
///     camera->getStats()->collectStats("scene", true);
///     RenderViewerFrame();
///     const std::int32_t polygons = SumPolygons(*camera->getStats());
///
/// "scene" counts what the cull has found: vertices, drawables, lights, bins, state graphs, primitive sets, and the
/// primitives of each kind. That costs a traversal of the render graph, so it is switched on for single frames.
/// "rendering" gives the times of cull and draw in seconds from the renderer's start, "gpu" those of the card.
class VtCOsgGpRenderer : public osgViewer::Renderer
{
public:
    explicit VtCOsgGpRenderer(osg::Camera* camera) : osgViewer::Renderer(camera) {}

    /// Where the view's display settings ask for serialised draw dispatch, one view of the process draws at a time.
    void cull_draw() override;

protected:
    ~VtCOsgGpRenderer() override = default;
};

/// Polygons of the latest frame in `stats`: those kinds of primitives that have an area. 0 for a frame without counts.
std::int32_t SumPolygons(const osg::Stats& stats);
