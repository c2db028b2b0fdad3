#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string_view>
#include <vector>

#include <osg/ref_ptr>

#include "records/AttributeTable.h"
#include "records/SceneObject.h"

/// Types of records, as their attribute `object_type` numbers them.
enum VtEObjectType : std::int32_t
{
    objectTypeAtmospherics = 0,
    objectTypeWindowLayout = 1,
    objectTypeRenderSettings = 2,
    objectTypeView = 3,
    objectTypeInstrument = 4,
    objectTypeObserver = 5,
    objectTypeStaticBody = 6,
    objectTypeMovableBody = 7,
    objectTypeTrack = 8,
    objectTypeDefaultObserver = 9, ///< "Free1" and "Free2"
};

// The tables of all classes. Each folder that stores something has a function that tells its own; the application
// object calls them. What follows is what the told tables say.

/// Tells `table`, which lives as long as the program. One that is there already stays as it is. Throws
/// `std::logic_error` when another table gives one of the names another type.
void RegisterAttributeTable(const VtCAttributeTable& table);

/// By their object types.
const std::vector<const VtCAttributeTable*>& GetAttributeTables();

/// False for a type of a later version, or of nobody.
inline bool IsKnownObjectType(std::int32_t type)
{
    return type >= objectTypeAtmospherics && type <= objectTypeDefaultObserver;
}

/// The type that every record gives an attribute of that name; nothing for names that aren't fixed.
std::optional<VtEAttributeType> FixedAttributeType(std::wstring_view name);

/// The type of `name` when a text doesn't tell it: the fixed one, that of a part's attribute ("<id>_position"), or
/// text.
VtEAttributeType AssumedAttributeType(std::wstring_view name);

/// How many numbers the list of that name holds in every record; nothing for lists of any length.
std::optional<std::size_t> FixedListLength(std::wstring_view name);

/// A new record with the values of a new object; null for a type without such a record.
osg::ref_ptr<VtISceneObject> MakeDefaultObject(std::int32_t objectType);
