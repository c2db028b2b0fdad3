#include "scene/MovableBody.h"

#include "base/Ids.h"
#include "scene/EulerAngles.h"
#include "scene/GroupParts.h"

#include <utility>

namespace
{

VtTFloatTupel3 TupelOr(const VtISceneObject& record, const std::wstring& name, const VtTFloatTupel3& otherwise)
{
    const auto* value = record.Find<VtTFloatTupel3>(name);
    return value ? *value : otherwise;
}

// Records hold vectors in scene axes; the placement in the group is in the y-up axes of the models.
osg::Matrixd PlaceInGroup(const VtISceneObject& group, const std::wstring& id)
{
    const VtTFloatTupel3 position = TupelOr(group, id + L"_position", {0, 0, 0});
    const VtTFloatTupel3 angles = TupelOr(group, id + L"_rotation", {0, 0, 0});
    const VtTFloatTupel3 factors = TupelOr(group, id + L"_scale", {1, 1, 1});
    osg::Matrixd place = osg::Matrixd::scale(factors[0], factors[2], factors[1]) *
                         osg::Matrixd::rotate(RotationFromEuler(angles[0], angles[2], angles[1]));
    place.setTrans(position[0], position[2], -position[1]);
    return place;
}

} // namespace

void VtC3DMovableBody::ExpandGroup()
{
    const std::int32_t* partCount = attributeObject->Find<std::int32_t>(L"child_count");
    const auto* stored = attributeObject->Find<std::vector<std::wstring>>(L"child_ids");
    if (!partCount || *partCount <= 0 || !stored)
        return;

    // Ids of the model's file stand for every body that shows it, so each group gets fresh ones for its parts.
    std::vector<std::pair<std::wstring, std::wstring>> ids;
    for (const std::wstring& oldId : *stored)
        ids.emplace_back(oldId, base::NewId());

    std::vector<std::wstring> newIds;
    for (const auto& [oldId, newId] : ids)
    {
        newIds.push_back(newId);
        childIds.push_back(newId);
        const std::wstring file = PartFile(*transformNode, oldId, GetFilePath());
        if (!file.empty() && !IsOwnOrAncestorFile(file))
            AddPart(oldId, newId, file);
        for (const wchar_t* what : {L"_name", L"_position", L"_rotation", L"_scale", L"_scale_orient"})
            MoveAttribute(oldId + what, newId + what);
    }
    for (const auto& [oldId, newId] : ids)
    {
        MoveAttribute(oldId + L"_simulation_data_index", newId + L"_simulation_data_index");
        MoveAttribute(oldId + L"_simulation_data_stream", newId + L"_simulation_data_stream");
        AddMissingAttribute(L"string", L"Not connected", newId + L"_simulation_data_index");
        AddMissingAttribute(L"int", L"-1", newId + L"_simulation_data_stream");
    }
    WriteAttribute(L"child_ids", std::move(newIds));
}

void VtC3DMovableBody::AddPart(const std::wstring& oldId, const std::wstring& newId, const std::wstring& path)
{
    const auto* name = attributeObject->Find<std::wstring>(oldId + L"_name");
    auto* part = new VtC3DMovableBody(GetDocument(), *this, name ? *name : std::wstring(), path, osg::Matrixd(), true,
                                      nullptr, newId);
    part->isGroupChild = true;
    part->AddMissingAttribute(L"string", internalId, L"parent_group_id");
    part->UpdateBaseTransform();
    part->groupChildMatrix = PlaceInGroup(*attributeObject, oldId);
    part->SetTransform(part->groupChildMatrix * insertMatrix);
    part->StoreLastTransform();
}

void VtC3DMovableBody::MoveAttribute(const std::wstring& oldName, const std::wstring& newName)
{
    const VtISceneAttribute* attribute = attributeObject->GetAttribute(oldName);
    if (!attribute)
        return;
    WriteAttribute(newName, attribute->GetValue());
    attributeObject->RemoveAttribute(oldName);
}
