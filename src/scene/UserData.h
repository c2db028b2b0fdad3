#pragma once

#include <osg/Referenced>

class VtCGlidePanelAbstractNavigatorObject;

/// Tells which object a node of the graph belongs to; the user data of the nodes of bodies and collections.
class VtCOsgUserData : public osg::Referenced
{
public:
    explicit VtCOsgUserData(VtCGlidePanelAbstractNavigatorObject& nodeOwner) : owner(&nodeOwner) {}

    VtCGlidePanelAbstractNavigatorObject* owner; ///< not owned; the object takes the user data off its node at its end
};
