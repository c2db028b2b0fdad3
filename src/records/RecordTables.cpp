#include "records/RecordTables.h"

#include <array>
#include <string>
#include <unordered_map>

namespace
{

using Type = VtEAttributeType;

// One name has one type in all records.
const std::unordered_map<std::wstring_view, Type>& FixedTypes()
{
    static const std::unordered_map<std::wstring_view, Type> types = {
        {L"object_type", Type::integer},
        {L"internal_id", Type::text},
        {L"name", Type::text},
        // bodies
        {L"file_path", Type::text},
        {L"position", Type::floatTupel3},
        {L"rotation", Type::floatTupel3},
        {L"scale", Type::floatTupel3},
        {L"scale_orient", Type::floatTupel3},
        {L"center", Type::floatTupel3},
        {L"simulation_data_index", Type::text},
        {L"simulation_data_stream", Type::integer},
        {L"last_transform_matrix", Type::floatList},
        {L"insert_transform_matrix", Type::floatList},
        {L"visible", Type::integer},
        {L"selectable", Type::integer},
        {L"fixed_to_world", Type::integer},
        {L"transparency", Type::real},
        {L"render_mode", Type::integer},
        {L"dye_enabled", Type::integer},
        {L"dye_color", Type::intTupel3},
        {L"is_grouped", Type::integer},
        {L"child_count", Type::integer},
        {L"child_ids", Type::textList},
        {L"parent_group_id", Type::text},
        {L"parent_object_id", Type::text},
        {L"cloned_from", Type::text},
        {L"track_id", Type::integer},
        {L"basetexture", Type::text},
        {L"decalMap", Type::text},
        {L"batterTexture", Type::text},
        {L"roadSurfaceTexture", Type::text},
        {L"roadFrictionMapTexture", Type::text},
        {L"roadSurfaceTexX", Type::text},
        {L"roadSurfaceTexY", Type::text},
        // observers
        {L"behaviour", Type::integer},
        {L"attached_to", Type::text},
        {L"orientation", Type::floatTupel3},
        {L"translation", Type::floatTupel3},
        {L"cloned", Type::integer},
        // tracks
        {L"mdf_file", Type::text},
        {L"time_offset", Type::real},
        {L"play_loop", Type::integer},
        {L"data_source", Type::integer},
        {L"auto_update", Type::integer},
        {L"active", Type::integer},
        {L"buffer_empty", Type::integer},
        // views, window layout and render settings
        {L"observer", Type::text},
        {L"track", Type::integer},
        {L"view_angle", Type::real},
        {L"front_clip_plane", Type::real},
        {L"back_clip_plane", Type::real},
        {L"view_pos", Type::integer},
        {L"splitter_position", Type::floatList},
        {L"global_render_mode", Type::integer},
    };
    return types;
}

struct PartAttribute
{
    std::wstring_view suffix;
    Type type;
};

constexpr PartAttribute partAttributes[] = {
    {L"_simulation_data_index", Type::text},
    {L"_simulation_data_stream", Type::integer},
    {L"_name", Type::text},
    {L"_position", Type::floatTupel3},
    {L"_rotation", Type::floatTupel3},
    {L"_scale", Type::floatTupel3},
    {L"_scale_orient", Type::floatTupel3},
};

constexpr VtTFloatTupel3 zero{0, 0, 0};
constexpr VtTFloatTupel3 unitScale{1, 1, 1};

void AddViewDefaults(VtISceneObject& object)
{
    object.AddAttribute(L"observer", std::wstring());
    object.AddAttribute(L"track", -1);
    object.AddAttribute(L"view_angle", 40.0F);
    object.AddAttribute(L"front_clip_plane", 0.015F);
    object.AddAttribute(L"back_clip_plane", 10000.0F);
    object.AddAttribute(L"view_pos", 0);
}

// The mode stands first: whether the observer is free decides how the rest is taken.
void AddObserverDefaults(VtISceneObject& object, std::int32_t followMode)
{
    object.AddAttribute(L"behaviour", followMode);
    object.AddAttribute(L"attached_to", std::wstring(L"Not connected"));
    object.AddAttribute(L"position", zero);
    object.AddAttribute(L"orientation", zero);
    object.AddAttribute(L"translation", zero);
    object.AddAttribute(L"rotation", zero);
}

void AddBodyDefaults(VtISceneObject& object)
{
    object.AddAttribute(L"visible", 1);
    object.AddAttribute(L"selectable", 1);
    object.AddAttribute(L"fixed_to_world", 0);
    object.AddAttribute(L"transparency", 0.0F);
    object.AddAttribute(L"render_mode", 1);
    object.AddAttribute(L"dye_enabled", 0);
    object.AddAttribute(L"dye_color", VtTIntTupel3{0, 0, 0});
    object.AddAttribute(L"is_grouped", 0);
}

} // namespace

std::optional<VtEAttributeType> FixedAttributeType(std::wstring_view name)
{
    const auto at = FixedTypes().find(name);
    return at == FixedTypes().end() ? std::nullopt : std::optional(at->second);
}

VtEAttributeType AssumedAttributeType(std::wstring_view name)
{
    if (const std::optional<Type> fixed = FixedAttributeType(name))
        return *fixed;
    for (const PartAttribute& part : partAttributes)
        if (name.ends_with(part.suffix))
            return part.type;
    return Type::text;
}

std::optional<std::size_t> FixedListLength(std::wstring_view name)
{
    if (name == L"last_transform_matrix" || name == L"insert_transform_matrix")
        return 16;
    if (name == L"splitter_position")
        return 2;
    return std::nullopt;
}

osg::ref_ptr<VtISceneObject> MakeDefaultObject(std::int32_t objectType)
{
    osg::ref_ptr<VtISceneObject> object = new VtISceneObject(objectType);
    object->AddAttribute(L"object_type", objectType);
    object->AddAttribute(L"internal_id", std::wstring());
    object->AddAttribute(L"name", std::wstring());
    switch (objectType)
    {
    case objectTypeWindowLayout:
        object->Write(L"name", std::wstring(L"Window_Layout"));
        object->AddAttribute(L"splitter_position", std::vector<float>{0.5F, 0.5F});
        return object;
    case objectTypeRenderSettings:
        object->AddAttribute(L"global_render_mode", 5);
        return object;
    case objectTypeView:
        AddViewDefaults(*object);
        return object;
    case objectTypeObserver:
        AddObserverDefaults(*object, 1);
        return object;
    case objectTypeDefaultObserver:
        AddObserverDefaults(*object, 0);
        return object;
    case objectTypeStaticBody:
    case objectTypeMovableBody:
        break;
    default:
        return nullptr;
    }

    object->AddAttribute(L"file_path", std::wstring());
    object->AddAttribute(L"position", zero);
    object->AddAttribute(L"rotation", zero);
    object->AddAttribute(L"scale", unitScale);
    if (objectType == objectTypeStaticBody)
        object->AddAttribute(L"scale_orient", zero);
    object->AddAttribute(L"center", zero);
    if (objectType == objectTypeMovableBody)
    {
        // The index stands before the name, so that on replaying the record a name that the data point knows wins.
        object->AddAttribute(L"simulation_data_stream", -1);
        object->AddAttribute(L"simulation_data_index", std::wstring());
        object->AddAttribute(L"last_transform_matrix",
                             std::vector<float>{1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1});
    }
    AddBodyDefaults(*object);
    return object;
}
