#include "scene/StaticBodies.h"

VtCStaticBodies::VtCStaticBodies(VtISceneDocument& owningDocument, osg::Group* collectionParent,
                                 const std::wstring& name)
    : VtC3DBodies(owningDocument, collectionParent, name)
{
    const osg::ref_ptr<osg::Group> group = transformNode;
    axesNode = new osg::MatrixTransform(osg::Matrixd(1, 0, 0, 0, 0, 0, 1, 0, 0, -1, 0, 0, 0, 0, 0, 1));
    axesNode->setName(group->getName());
    SetTransformNode(axesNode);
    if (parentNode)
        parentNode->replaceChild(group, axesNode);
}

void VtCStaticBodies::RemoveBody(const std::wstring& id)
{
    auto* body = dynamic_cast<VtC3DBody*>(FindById(id));
    if (!body)
        return;
    body->Destroy();
    SetModified();
}
