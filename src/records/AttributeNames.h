#pragma once

#include <string_view>

/// The names of stored attributes, as they stand in files. What they mean stands in the tables of the classes.
namespace attribute
{

// every record
inline constexpr std::wstring_view objectType = L"object_type";
inline constexpr std::wstring_view internalId = L"internal_id";
inline constexpr std::wstring_view name = L"name";

// bodies, and observers as far as they share them
inline constexpr std::wstring_view filePath = L"file_path";
inline constexpr std::wstring_view position = L"position";
inline constexpr std::wstring_view rotation = L"rotation";
inline constexpr std::wstring_view scale = L"scale";
inline constexpr std::wstring_view scaleOrient = L"scale_orient";
inline constexpr std::wstring_view center = L"center";
inline constexpr std::wstring_view visible = L"visible";
inline constexpr std::wstring_view selectable = L"selectable";
inline constexpr std::wstring_view fixedToWorld = L"fixed_to_world";
inline constexpr std::wstring_view renderMode = L"render_mode";
inline constexpr std::wstring_view dyeColor = L"dye_color";
inline constexpr std::wstring_view dyeEnabled = L"dye_enabled";
inline constexpr std::wstring_view transparency = L"transparency";
inline constexpr std::wstring_view isGrouped = L"is_grouped";
inline constexpr std::wstring_view childCount = L"child_count";
inline constexpr std::wstring_view childIds = L"child_ids";
inline constexpr std::wstring_view parentObjectId = L"parent_object_id";
inline constexpr std::wstring_view parentGroupId = L"parent_group_id";
inline constexpr std::wstring_view clonedFrom = L"cloned_from";
inline constexpr std::wstring_view trackId = L"track_id";
inline constexpr std::wstring_view lastTransformMatrix = L"last_transform_matrix";
inline constexpr std::wstring_view insertTransformMatrix = L"insert_transform_matrix";

// The names of these two run crosswise: the first holds the index of the channel, the second its name. Stored scenes
// rely on it.
inline constexpr std::wstring_view channelIndex = L"simulation_data_stream";
inline constexpr std::wstring_view channelName = L"simulation_data_index";

// observers
inline constexpr std::wstring_view behaviour = L"behaviour";
inline constexpr std::wstring_view attachedTo = L"attached_to";
inline constexpr std::wstring_view orientation = L"orientation";
inline constexpr std::wstring_view translation = L"translation";
inline constexpr std::wstring_view cloned = L"cloned";

// views, window layout, render settings
inline constexpr std::wstring_view observer = L"observer";
inline constexpr std::wstring_view track = L"track";
inline constexpr std::wstring_view viewAngle = L"view_angle";
inline constexpr std::wstring_view frontClipPlane = L"front_clip_plane";
inline constexpr std::wstring_view backClipPlane = L"back_clip_plane";
inline constexpr std::wstring_view viewPos = L"view_pos";
inline constexpr std::wstring_view splitterPosition = L"splitter_position";
inline constexpr std::wstring_view globalRenderMode = L"global_render_mode";

/// In the place of a channel and of a body: none. The same in every language.
inline constexpr std::wstring_view notConnected = L"Not connected";

} // namespace attribute
