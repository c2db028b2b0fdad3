#pragma once

#include <osg/Referenced>

class VtCPanoramicView;

/// Tells which pane an `osgViewer::View` belongs to.
class VtCOsgViewUserData : public osg::Referenced
{
public:
    explicit VtCOsgViewUserData(VtCPanoramicView& viewOwner) : owner(&viewOwner) {}

    VtCPanoramicView* owner; ///< not owned; null once the pane is gone
};
