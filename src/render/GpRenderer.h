#pragma once

#include <osgViewer/Renderer>

/// The renderer of a view's camera: the library's in single-threaded mode, which beside drawing collects the
/// statistics that the camera's `osg::Stats` asks for ("scene", "rendering", "gpu").
class VtCOsgGpRenderer : public osgViewer::Renderer
{
public:
    explicit VtCOsgGpRenderer(osg::Camera* camera);

    void cull_draw() override;

protected:
    ~VtCOsgGpRenderer() override = default;
};
