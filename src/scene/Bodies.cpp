#include "scene/Bodies.h"

#include "base/Text.h"

VtC3DBodies::VtC3DBodies(VtISceneDocument& owningDocument, osg::Group* collectionParent, const std::wstring& name)
    : VtC3DBody(owningDocument, nullptr, name, {}, false, {})
{
    parentNode = collectionParent;
    osg::ref_ptr<osg::Group> group = new osg::Group;
    group->setName(base::Utf8(name));
    SetTransformNode(group);
    if (parentNode)
        parentNode->addChild(group);
}

void VtC3DBodies::RemoveMembers()
{
    while (!GetChildren().empty())
    {
        VtCGlidePanelAbstractNavigatorObject& first = *GetChildren().front();
        if (auto* body = dynamic_cast<VtC3DBody*>(&first))
            body->Destroy();
        else
            RemoveChild(first);
    }
}
