#pragma once

#include <osg/ref_ptr>

class VtCPanoramicView;
namespace osg
{
class GraphicsContext;
class Node;
} // namespace osg
namespace osgViewer
{
class View;
}

namespace bench
{

/// The library's own view of `scene` in `context`, with the camera and the light that `pane` has now: what a baseline
/// draws.
osg::ref_ptr<osgViewer::View> MakeBareView(VtCPanoramicView& pane, osg::Node* scene, osg::GraphicsContext* context);

/// Lets each frame of `view` end when its picture is finished: what is only handed to the driver would be paid for by
/// whoever is measured next.
void FinishFrames(osgViewer::View& view);

} // namespace bench
