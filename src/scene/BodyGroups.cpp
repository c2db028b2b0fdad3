// Bodies whose model is a group of parts: each part becomes a body of its own below the group.

#include "base/Ids.h"
#include "base/Paths.h"
#include "base/Text.h"
#include "records/AttributeNames.h"
#include "scene/Collectors.h"
#include "scene/MovableBody.h"
#include "scene/StaticBody.h"

#include <algorithm>
#include <filesystem>
#include <string>
#include <utility>

namespace
{

/// The model file (complete path) of the part `id` of the group whose model hangs below `node`; empty without one.
///
/// The last proxy node of the model lists the parts: its children bear their ids, its file names of the same index
/// are their models. A name that isn't complete starts at the folder of `groupFile`.
std::wstring PartFile(osg::Group& node, const std::wstring& id, const std::wstring& groupFile)
{
    VtCOsgProxyFinder finder;
    node.accept(finder);
    if (finder.proxies.empty())
        return {};

    const osg::ProxyNode& proxy = *finder.proxies.back();
    for (unsigned i = 0; i < proxy.getNumChildren() && i < proxy.getNumFileNames(); ++i)
        if (base::Wide(proxy.getChild(i)->getName()) == id && !proxy.getFileName(i).empty())
        {
            const std::filesystem::path file = base::NativePath(base::Wide(proxy.getFileName(i)));
            // Plain forms compare equal, which tells a group that holds itself.
            return base::InnerPath((base::NativePath(groupFile).parent_path() / file).lexically_normal());
        }
    return {};
}

/// The attribute of a group that holds `name` of the part `id`.
std::wstring OfPart(const std::wstring& id, std::wstring_view name)
{
    return (id + L'_').append(name);
}

VtTFloatTupel3 TupelOr(const VtISceneObject& record, const std::wstring& name, const VtTFloatTupel3& otherwise)
{
    const auto* value = record.Find<VtTFloatTupel3>(name);
    return value ? *value : otherwise;
}

// Records hold vectors in scene axes; the placement in the group is in the y-up axes of the models.
osg::Matrixd PlaceInGroup(const VtISceneObject& group, const std::wstring& id)
{
    const VtTFloatTupel3 position = TupelOr(group, OfPart(id, attribute::position), {0, 0, 0});
    const VtTFloatTupel3 angles = TupelOr(group, OfPart(id, attribute::rotation), {0, 0, 0});
    const VtTFloatTupel3 factors = TupelOr(group, OfPart(id, attribute::scale), {1, 1, 1});
    osg::Matrixd place = osg::Matrixd::scale(factors[0], factors[2], factors[1]) *
                         osg::Matrixd::rotate(RotationFromEuler(angles[0], angles[2], angles[1]));
    place.setTrans(position[0], position[2], -position[1]);
    return place;
}

} // namespace

void VtC3DMovableBody::ExpandGroup()
{
    const std::int32_t* partCount = attributeObject->Find<std::int32_t>(attribute::childCount);
    const auto* stored = attributeObject->Find<std::vector<std::wstring>>(attribute::childIds);
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
        for (const std::wstring_view what :
             {attribute::name, attribute::position, attribute::rotation, attribute::scale, attribute::scaleOrient})
            MoveAttribute(OfPart(oldId, what), OfPart(newId, what));
    }
    for (const auto& [oldId, newId] : ids)
    {
        for (const std::wstring_view what : {attribute::channelName, attribute::channelIndex})
            MoveAttribute(OfPart(oldId, what), OfPart(newId, what));
        AddMissingAttribute(OfPart(newId, attribute::channelName), std::wstring(attribute::notConnected));
        AddMissingAttribute(OfPart(newId, attribute::channelIndex), -1);
    }
    WriteAttribute(attribute::childIds, std::move(newIds));
}

void VtC3DMovableBody::AddPart(const std::wstring& oldId, const std::wstring& newId, const std::wstring& path)
{
    const auto* name = attributeObject->Find<std::wstring>(OfPart(oldId, attribute::name));
    auto* part = new VtC3DMovableBody(GetDocument(), *this, name ? *name : std::wstring(), path, osg::Matrixd(), true,
                                      nullptr, newId);
    part->isGroupChild = true;
    part->AddMissingAttribute(attribute::parentGroupId, internalId);
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

void VtC3DStaticBody::ExpandGroup()
{
    const std::int32_t* partCount = attributeObject->Find<std::int32_t>(attribute::childCount);
    const auto* ids = attributeObject->Find<std::vector<std::wstring>>(attribute::childIds);
    if (!partCount || *partCount <= 0 || !ids)
        return;
    childIds = *ids;
    for (const std::wstring& id : childIds)
    {
        const std::wstring file = PartFile(*transformNode, id, GetFilePath());
        if (!file.empty() && !IsOwnOrAncestorFile(file))
            AddPart(id, file);
    }
}

void VtC3DStaticBody::AddPart(const std::wstring& id, const std::wstring& path)
{
    const auto* name = attributeObject->Find<std::wstring>(OfPart(id, attribute::name));
    auto* part =
        new VtC3DStaticBody(GetDocument(), *this, name ? *name : std::wstring(), path, osg::Matrixd(), true, id);
    part->isGroupChild = true;
    for (const std::wstring_view what : {attribute::position, attribute::rotation, attribute::scale})
        if (const VtISceneAttribute* stored = attributeObject->GetAttribute(OfPart(id, what)))
            part->SetStored(what, stored->GetValue());
    part->UpdateBaseTransform();
}

void VtC3DStaticBody::SetStored(std::wstring_view name, const VtTAttributeValue& value)
{
    const VtTAttributeRow* row = Attributes().Find(name);
    if (row->GetType() != static_cast<VtEAttributeType>(value.index()))
        return;
    row->take(*this, value);
    WriteBack(name);
}

void VtC3DStaticBody::OnChildAttributeChanged(std::wstring_view attributeName, const VtTAttributeValue& value)
{
    const auto holds = [&](std::wstring_view text) { return attributeName.find(text) != std::wstring_view::npos; };
    const auto id = std::find_if(childIds.begin(), childIds.end(),
                                 [&](const std::wstring& entry) { return !entry.empty() && holds(entry); });
    auto* part = id == childIds.end() ? nullptr : dynamic_cast<VtC3DStaticBody*>(FindById(*id));
    if (!part)
        return;
    // "_scale_orient" comes before "_scale", which is a part of it.
    for (const std::wstring_view name :
         {attribute::position, attribute::rotation, attribute::scaleOrient, attribute::name, attribute::scale})
        if (holds(OfPart({}, name)))
        {
            part->SetStored(name, value);
            break;
        }
    part->UpdateBaseTransform();
}
