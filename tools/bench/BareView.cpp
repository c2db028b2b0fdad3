#include "tools/bench/BareView.h"

#include <osg/GL>
#include <osgViewer/View>

#include "render/PanoramicView.h"

namespace bench
{

namespace
{

struct Finish : osg::Camera::DrawCallback
{
    void operator()(osg::RenderInfo&) const override { glFinish(); }
};

} // namespace

osg::ref_ptr<osgViewer::View> MakeBareView(VtCPanoramicView& pane, osg::Node* scene, osg::GraphicsContext* context)
{
    osg::ref_ptr<osgViewer::View> view = new osgViewer::View;
    const osg::Camera& model = *pane.getView()->getCamera();
    osg::Camera& camera = *view->getCamera();
    camera.setGraphicsContext(context);
    camera.setViewport(new osg::Viewport(*model.getViewport()));
    camera.setClearMask(model.getClearMask());
    camera.setClearColor(model.getClearColor());
    camera.setComputeNearFarMode(model.getComputeNearFarMode());
    camera.setProjectionMatrix(model.getProjectionMatrix());
    camera.setViewMatrix(model.getViewMatrix());
    view->setLightingMode(pane.getView()->getLightingMode());
    view->setSceneData(scene);
    FinishFrames(*view);
    return view;
}

void FinishFrames(osgViewer::View& view)
{
    view.getCamera()->setFinalDrawCallback(new Finish);
}

} // namespace bench
