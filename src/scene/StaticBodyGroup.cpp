#include "scene/StaticBody.h"

#include "scene/GroupParts.h"

#include <algorithm>

osg::Vec3f VtC3DStaticBody::ToModelAxes(const VtTFloatTupel3& stored)
{
    return osg::Vec3f(stored[0], stored[2], -stored[1]);
}

osg::Vec3f VtC3DStaticBody::ToModelScale(const VtTFloatTupel3& stored)
{
    return osg::Vec3f(stored[0] * 100, stored[2] * 100, stored[1] * 100);
}

void VtC3DStaticBody::ExpandGroup()
{
    const std::int32_t* partCount = attributeObject->Find<std::int32_t>(L"child_count");
    const auto* ids = attributeObject->Find<std::vector<std::wstring>>(L"child_ids");
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
    const auto* name = attributeObject->Find<std::wstring>(id + L"_name");
    auto* part =
        new VtC3DStaticBody(GetDocument(), *this, name ? *name : std::wstring(), path, osg::Matrixd(), true, id);
    part->isGroupChild = true;
    if (const auto* stored = attributeObject->Find<VtTFloatTupel3>(id + L"_position"))
        part->position = ToModelAxes(*stored);
    if (const auto* stored = attributeObject->Find<VtTFloatTupel3>(id + L"_rotation"))
        part->rotation = ToModelAxes(*stored);
    if (const auto* stored = attributeObject->Find<VtTFloatTupel3>(id + L"_scale"))
        part->scale = ToModelScale(*stored);
    part->UpdateBaseTransform();
}

void VtC3DStaticBody::OnChildAttributeChanged(std::wstring_view attributeName, const VtTAttributeValue& value)
{
    const auto holds = [&](std::wstring_view part) { return attributeName.find(part) != std::wstring_view::npos; };
    const auto id = std::find_if(childIds.begin(), childIds.end(),
                                 [&](const std::wstring& entry) { return !entry.empty() && holds(entry); });
    auto* part = id == childIds.end() ? nullptr : dynamic_cast<VtC3DStaticBody*>(FindById(*id));
    if (!part)
        return;

    const VtTFloatTupel3* vector = std::get_if<VtTFloatTupel3>(&value);
    const std::wstring* text = std::get_if<std::wstring>(&value);
    // "_scale_orient" comes before "_scale", which is a part of it.
    if (holds(L"_position"))
        part->position = vector ? ToModelAxes(*vector) : part->position;
    else if (holds(L"_rotation"))
        part->rotation = vector ? ToModelAxes(*vector) : part->rotation;
    else if (holds(L"_scale_orient"))
        part->scaleOrientation = vector ? ToModelAxes(*vector) : part->scaleOrientation;
    else if (holds(L"_name"))
        part->SetDisplayName(text ? *text : part->GetName());
    else if (holds(L"_scale"))
        part->scale = vector ? ToModelScale(*vector) : part->scale;
    part->UpdateBaseTransform();
}
