#include "scene/MovableBody.h"

#include "base/Maths.h"
#include "base/Text.h"
#include "records/RecordTables.h"
#include "records/SceneObjectStore.h"
#include "scene/LibraryPath.h"
#include "scene/MovableBodies.h"
#include "scene/SceneServices.h"

#include <algorithm>

#include <osg/Quat>

namespace
{

constexpr std::wstring_view identityText = L"1 0 0 0 0 1 0 0 0 0 1 0 0 0 0 1";

VtTFloatTupel3 TupelOf(const osg::Vec3f& vector)
{
    return {vector.x(), vector.y(), vector.z()};
}

std::vector<float> RowsOf(const osg::Matrixd& matrix)
{
    return std::vector<float>(matrix.ptr(), matrix.ptr() + 16);
}

bool AllFinite(const std::vector<float>& values)
{
    return std::all_of(values.begin(), values.end(), [](float value) { return std::isfinite(value); });
}

} // namespace

VtC3DMovableBody::VtC3DMovableBody(VtISceneDocument& owningDocument, VtCGlidePanelAbstractNavigatorObject& parentObject,
                                   const std::wstring& name, const std::wstring& path,
                                   const osg::Matrixd& insertTransform, bool inTree, osg::Node* model,
                                   const std::wstring& id, bool recordFollows)
    : VtC3DBody(owningDocument, &parentObject, name, path, inTree, id)
{
    JoinParent();

    VtTSceneServices& services = GetServices();
    modelNode = model ? model : services.models.loadModel(path, true);
    const std::string description = model ? std::string() : services.models.getXmlAttributes(path);

    osg::ref_ptr<osg::MatrixTransform> transform = new osg::MatrixTransform;
    transform->addChild(modelNode);
    transform->setName(base::Utf8(name));
    transform->setDataVariance(osg::Object::DYNAMIC);
    if (parentNode)
        parentNode->addChild(transform);
    SetTransformNode(transform);
    BuildMaterialMaps();

    if (dynamic_cast<VtC3DMovableBody*>(&parentObject))
        attributeObject = services.store.GetObject(internalId);
    if (!attributeObject)
        MakeAttributeObject(description, objectTypeMovableBody, recordFollows);
    if (attributeObject)
        FillAttributes(insertTransform);
    PublishAttributes();
    if (!isGrouped)
        UpdateBaseTransform();
}

VtC3DMovableBody::~VtC3DMovableBody()
{
    transformNode->setUserData(nullptr);
    while (transformNode->getNumParents() > 0)
        transformNode->getParent(0)->removeChild(transformNode);
    while (!parts.empty())
    {
        parts.front()->RemoveAttributeObject();
        parts.front()->Destroy();
    }
    pool->GiveBack(*motion);
}

void VtC3DMovableBody::JoinParent()
{
    auto* group = dynamic_cast<VtC3DMovableBody*>(GetParent());
    auto* collection = dynamic_cast<VtCMovableBodies*>(group ? group->GetParent() : GetParent());
    pool = collection ? collection->pool : std::make_shared<VtCMotionPool>();
    motion = &pool->Take();
    if (group)
        group->parts.push_back(this);
    else if (collection)
        collection->bodies.push_back(this);
    if (collection)
        collection->motionsStale = true;
}

void VtC3DMovableBody::SetTransformNode(osg::Group* node)
{
    VtC3DBody::SetTransformNode(node);
    motion->node = matrixNode;
}

void VtC3DMovableBody::ChildRemoved(VtCGlidePanelAbstractNavigatorObject& child)
{
    std::erase_if(parts, [&](VtC3DMovableBody* part) { return part == &child; });
    if (auto* collection = dynamic_cast<VtCMovableBodies*>(GetParent()))
        collection->motionsStale = true;
}

void VtC3DMovableBody::FillAttributes(const osg::Matrixd& insertTransform)
{
    const std::int32_t* grouped = attributeObject->Find<std::int32_t>(L"is_grouped");
    if (grouped)
        isGrouped = *grouped != 0;

    // The description of a model calls it static unless somebody has made it for movable bodies.
    if (attributeObject->GetObjectType() != objectTypeMovableBody)
    {
        attributeObject->SetObjectType(objectTypeMovableBody);
        WriteAttribute(L"object_type", std::int32_t{objectTypeMovableBody});
        if (isGrouped)
        {
            matrixNode->setMatrix(osg::Matrixd());
            AddMissingAttribute(L"floatList", identityText, L"insert_transform_matrix");
            SetInsertMatrix(insertTransform);
        }
        else
        {
            AddMissingAttribute(L"string", L"", L"simulation_data_index");
            AddMissingAttribute(L"int", L"-1", L"simulation_data_stream");
        }
        AddMissingAttribute(L"floatList", identityText, L"last_transform_matrix");
        attributeObject->RemoveAttribute(L"parent_object_id");
    }

    AddMissingAttribute(L"floatTupel3", L"0.0 0.0 0.0", L"center");
    WriteAttribute(L"name", GetName());
    WriteAttribute(L"internal_id", internalId);
    WriteAttribute(L"file_path", ToPortablePath(GetFilePath(), GetServices().paths));
    WriteAttribute(L"position", TupelOf(center));
    WriteAttribute(L"scale", TupelOf(scale / 100.0F));
    WriteAttribute(L"rotation", TupelOf(rotation));
    AddMissingDyeAttributes();
    if (isGrouped)
        ExpandGroup();
}

void VtC3DMovableBody::UpdateBaseTransform()
{
    if (isGrouped)
        baseMatrix.makeIdentity();
    else
    {
        constexpr float quarterTurn = base::floatPi / 2;
        const osg::Quat aboutX(base::RadiansFromDegrees(rotation.x()) + quarterTurn, osg::Vec3d(1, 0, 0));
        const osg::Quat aboutY(base::RadiansFromDegrees(rotation.z()), osg::Vec3d(0, 1, 0));
        const osg::Quat aboutZ(base::RadiansFromDegrees(rotation.y()), osg::Vec3d(0, 0, 1));
        osg::Matrixd turn;
        turn.makeRotate(aboutZ * aboutY * aboutX);
        baseMatrix = osg::Matrixd::scale(scale.x() / 100.0, scale.y() / 100.0, scale.z() / 100.0) * turn;
        baseMatrix.setTrans(center);
    }
    ApplyTransform();
}

void VtC3DMovableBody::SetLastTransformMatrix(const osg::Matrixd& matrix)
{
    motion->lastTransformMatrix = matrix;
    motion->lastTransformMatrix(3, 3) = 1.0;
    ApplyTransform();
}

void VtC3DMovableBody::ApplyTransform()
{
    motion->SetBase(baseMatrix);
    if (isGrouped)
        SetTransform(baseMatrix * motion->lastTransformMatrix);
    else
        motion->MoveNode();
}

void VtC3DMovableBody::SetTransform(const osg::Matrixd& matrix)
{
    if (!isGrouped)
    {
        VtC3DBody::SetTransform(matrix);
        return;
    }
    for (VtC3DMovableBody* part : parts)
        part->SetTransform(part->groupChildMatrix * matrix);
}

void VtC3DMovableBody::StoreLastTransform()
{
    std::vector<float> rows = RowsOf(GetTransform());
    if (AllFinite(rows))
        WriteAttribute(L"last_transform_matrix", std::move(rows));
    for (VtC3DMovableBody* part : parts)
        part->StoreLastTransform();
}

void VtC3DMovableBody::SetInsertMatrix(const osg::Matrixd& matrix)
{
    insertMatrix = matrix;
    std::vector<float> rows = RowsOf(matrix);
    if (AllFinite(rows))
        WriteAttribute(L"insert_transform_matrix", std::move(rows));
}

VtC3DMovableBody* VtC3DMovableBody::CloneIntoTrack(VtCMovableBodies& target, VtCTrack* clonesTrack,
                                                   std::int32_t trackNumber)
{
    if (!modelNode)
        return nullptr;

    const osg::ref_ptr<osg::Node> copy = GetServices().models.clone(modelNode);
    auto* clone = new VtC3DMovableBody(GetDocument(), target, GetName(), GetFilePath(), osg::Matrixd(),
                                       HasNavigatorItem(), copy, {});
    clone->cloneSource = this;
    clone->track = clonesTrack;
    clone->SetScaleX(scale.x());
    clone->SetScaleY(scale.y());
    clone->SetScaleZ(scale.z());
    clone->SetRotationX(rotation.x());
    clone->SetRotationY(rotation.y());
    clone->SetRotationZ(rotation.z());
    clone->SetCenterX(center.x());
    clone->SetCenterY(center.y());
    clone->SetCenterZ(center.z());
    clone->ConnectChannel(motion->simulationDataIndex, {});

    if (clone->attributeObject && attributeObject)
    {
        for (const wchar_t* name : {L"position", L"scale", L"rotation", L"simulation_data_index"})
            if (const VtISceneAttribute* attribute = attributeObject->GetAttribute(name))
                clone->WriteAttribute(name, attribute->GetValue());
        clone->WriteAttribute(L"simulation_data_stream", motion->simulationDataIndex);
        clone->WriteAttribute(L"cloned_from", internalId);
        clone->WriteAttribute(L"track_id", trackNumber);
    }
    return clone;
}

void VtC3DMovableBody::FinishLoad(const std::wstring& id)
{
    RebindAttributes(id);
    AddMissingDyeAttributes();
}
