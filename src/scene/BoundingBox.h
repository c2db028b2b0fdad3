#pragma once

#include <osg/Group>
#include <osg/ref_ptr>

/// Edges of the box around everything below `node`, in the axes of its children, so that it can be added as one of
/// them. Named after the node with "_bbox" behind. Null when there is nothing to surround.
osg::ref_ptr<osg::Node> MakeBoundingBox(osg::Group& node);
