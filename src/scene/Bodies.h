#pragma once

#include <string>

#include "scene/Body.h"

/// A collection of bodies: itself a body, with a node that its members hang from.
///
/// It has no parent object; who makes it holds its reference.
class VtC3DBodies : public VtC3DBody
{
public:
    /// Destroys every member, first to last.
    void RemoveMembers();

protected:
    VtC3DBodies(VtISceneDocument& owningDocument, osg::Group* collectionParent, const std::wstring& name);
};
