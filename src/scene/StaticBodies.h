#pragma once

#include <string>

#include "scene/Bodies.h"

/// The static bodies of a scene. Its node turns the y-up axes of the models into the z-up axes of the scene: a point
/// (x, y, z) below it lies at (x, -z, y) in the scene.
class VtCStaticBodies : public VtC3DBodies
{
public:
    VtCStaticBodies(VtISceneDocument& owningDocument, osg::Group* collectionParent, const std::wstring& name);

    std::wstring GetSectionFormat() const override { return L"STATICBODY_%d"; }

    osg::MatrixTransform* GetAxesNode() const { return axesNode.get(); }

    /// Destroys the body of that id and marks the document as changed; nothing when there is none.
    void RemoveBody(const std::wstring& id);

    void RemoveAllBodies() { RemoveMembers(); }

protected:
    ~VtCStaticBodies() override = default;

private:
    osg::ref_ptr<osg::MatrixTransform> axesNode; ///< the collection's node
};
