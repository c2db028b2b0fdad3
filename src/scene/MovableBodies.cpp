#include "scene/MovableBodies.h"

#include "scene/MovableBody.h"
#include "scene/Scene3D.h"
#include "scene/SceneServices.h"

#include <algorithm>

VtCMovableBodies::VtCMovableBodies(VtISceneDocument& owningDocument, osg::Group* collectionParent,
                                   const std::wstring& name, VtCTrack* bodiesTrack)
    : VtC3DBodies(owningDocument, collectionParent, name), track(bodiesTrack)
{
}

void VtCMovableBodies::ChildRemoved(VtCGlidePanelAbstractNavigatorObject& child)
{
    std::erase_if(bodies, [&](VtC3DMovableBody* body) { return body == &child; });
    motionsStale = true;
}

const std::vector<VtTBodyMotion*>& VtCMovableBodies::GetMotions()
{
    if (!motionsStale)
        return motions;
    motions.clear();
    const auto add = [&](const VtC3DMovableBody& body)
    {
        if (!body.IsGrouped())
            motions.push_back(&body.GetMotion());
    };
    for (const VtC3DMovableBody* body : bodies)
    {
        add(*body);
        for (const VtC3DMovableBody* part : body->GetParts())
            add(*part);
    }
    motionsStale = false;
    return motions;
}

void VtCMovableBodies::RemoveBody(const std::wstring& id)
{
    auto* body = dynamic_cast<VtC3DBody*>(FindById(id));
    if (!body)
        return;

    const VtCScene3D* scene = GetDocument().GetScene();
    // A clone can't outlive what it replays.
    for (std::int32_t i = 1; scene && i < scene->GetMovableBodiesCount(); ++i)
    {
        const std::vector<VtC3DMovableBody*> clones = scene->GetMovableBodies(i)->GetBodies();
        for (VtC3DMovableBody* clone : clones)
            if (clone->GetCloneSource() == body)
                clone->Destroy();
    }

    body->Destroy();
    SetModified();
}

void VtCMovableBodies::RemoveAllBodies()
{
    RemoveMembers();
    if (parentNode)
        parentNode->removeChild(transformNode);
}
