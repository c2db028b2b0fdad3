#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <optional>
#include <string>
#include <string_view>
#include <type_traits>
#include <unordered_map>
#include <utility>
#include <vector>

#include <osg/ref_ptr>

#include "records/SceneAttribute.h"
#include "records/SceneObject.h"

class VtCAttributeTable;

/// Whoever keeps its lasting values in a record: bodies, observers, views, the layout, the render settings.
class VtIRecordOwner
{
public:
    /// What the class stores. The same for the whole life of an object.
    virtual const VtCAttributeTable& GetAttributeTable() const = 0;

    /// The `internal_id` of the object.
    virtual const std::wstring& GetRecordId() const = 0;

    /// A value of the record was set by somebody else, or is replayed by a loader: the object takes it over.
    virtual void OnAttributeChanged(const std::wstring& objectId, const std::wstring& attributeName,
                                    const VtTAttributeValue& value) = 0;

    /// A stored value has changed, whoever has changed it: the document isn't what was saved.
    virtual void OnRecordChanged() = 0;

protected:
    ~VtIRecordOwner() = default;
};

/// One stored value of a class.
struct VtTAttributeRow
{
    VtTAttributeName name;

    /// That of a new object. It gives the attribute its type, and a list of floats its length unless it is empty.
    VtTAttributeValue defaultValue;

    /// Brings a stored value into the object, without writing it back. Empty: the record alone keeps the value.
    std::function<void(VtIRecordOwner&, const VtTAttributeValue&)> take;

    /// The object's present value; nothing while the record alone has one. Empty just where `take` is.
    std::function<std::optional<VtTAttributeValue>(const VtIRecordOwner&)> give;

    std::string_view meaning; ///< axes and units, for the page of the documentation

    bool inNewRecords = true;
    bool atSave = false;   ///< the record is brought up to date by a save, not with every change
    bool forParts = false; ///< a group stores it for each of its parts, as "<id>_<name>"

    VtEAttributeType GetType() const { return static_cast<VtEAttributeType>(defaultValue.index()); }

    /// Records may be without it.
    VtTAttributeRow&& Optional() && { return Set(inNewRecords, false); }
    VtTAttributeRow&& AtSave() && { return Set(atSave, true); }
    VtTAttributeRow&& ForParts() && { return Set(forParts, true); }

private:
    friend class VtCAttributeTable;

    VtTAttributeRow&& Set(bool& flag, bool value)
    {
        flag = value;
        return std::move(*this);
    }
};

using VtTAttributeRows = std::vector<VtTAttributeRow>;

namespace detail
{

// Truth values and enumerations are stored as integers.
template <class Value>
auto Stored(Value value)
{
    if constexpr (std::is_same_v<Value, bool> || std::is_enum_v<Value>)
        return static_cast<std::int32_t>(value);
    else if constexpr (std::is_convertible_v<Value, std::wstring_view>)
        return std::wstring(value);
    else
        return value;
}

template <class Value, class Found>
decltype(auto) Taken(const Found& stored)
{
    if constexpr (std::is_same_v<Value, bool>)
        return stored > 0;
    else if constexpr (std::is_enum_v<Value>)
        return static_cast<Value>(stored);
    else
        return (stored);
}

template <class Type>
struct IsOptional : std::false_type
{
};
template <class Type>
struct IsOptional<std::optional<Type>> : std::true_type
{
};

} // namespace detail

/// A row of a table of `Owner`. `take(owner, value)` and `give(owner)` are called as `std::invoke` calls, so they may
/// be functions, operations or fields of `Owner`; `give` may also return a `std::optional`.
///
///     Attribute<VtCLight>(L"intensity", 0.8F, &VtCLight::SetIntensity, &VtCLight::GetIntensity, "factor, 0 and up")
template <class Owner, class Value, class Take, class Give>
VtTAttributeRow Attribute(std::wstring_view name, Value defaultValue, Take take, Give give, std::string_view meaning)
{
    using Found = decltype(detail::Stored(defaultValue));
    VtTAttributeRow row;
    row.name = ShareAttributeName(name);
    row.defaultValue = detail::Stored(std::move(defaultValue));
    row.meaning = meaning;
    row.take = [take](VtIRecordOwner& owner, const VtTAttributeValue& value)
    {
        const auto& stored = detail::Taken<Value>(std::get<Found>(value));
        if constexpr (std::is_member_object_pointer_v<Take>)
            static_cast<Owner&>(owner).*take = stored;
        else
            std::invoke(take, static_cast<Owner&>(owner), stored);
    };
    row.give = [give](const VtIRecordOwner& owner) -> std::optional<VtTAttributeValue>
    {
        auto&& present = std::invoke(give, static_cast<const Owner&>(owner));
        using Present = std::remove_cvref_t<decltype(present)>;
        // Made in place: GCC 12 takes the end of a value that is handed over for a fault.
        if constexpr (!detail::IsOptional<Present>::value)
            return std::make_optional<VtTAttributeValue>(detail::Stored<Present>(present));
        else if (present)
            return std::make_optional<VtTAttributeValue>(detail::Stored(*present));
        else
            return std::nullopt;
    };
    return row;
}

/// A row of which the record alone keeps the value: identity, and what later readers of the record look at.
template <class Value>
VtTAttributeRow KeptAttribute(std::wstring_view name, Value defaultValue, std::string_view meaning)
{
    VtTAttributeRow row;
    row.name = ShareAttributeName(name);
    row.defaultValue = detail::Stored(std::move(defaultValue));
    row.meaning = meaning;
    return row;
}

/// What a class stores: each attribute once, in the order in which a record applies.
///
/// Everything that is said of stored attributes comes from here: new records, the types of records that name none, the
/// way of a value into the object and back, and the table in docs/attribute-objects.md. A class has one table for each
/// of its types of records, made once beside it and told to `RegisterAttributeTable`:
///
///     const VtCAttributeTable lightAttributes(objectTypeLight, {
///         IdentityRows(objectTypeLight),
///         {
///             Attribute<VtCLight>(L"colour", Rgb{255, 255, 255}, &VtCLight::SetColour, &VtCLight::GetColour, "0 to
///             255"), Attribute<VtCLight>(L"intensity", 0.8F, &VtCLight::SetIntensity, &VtCLight::GetIntensity,
///             "factor"),
///         }});
class VtCAttributeTable
{
public:
    enum class Names
    {
        exact,
        anyCase,
    };

    /// `parts` follow one another. A negative type stands for objects without records of their own.
    VtCAttributeTable(std::int32_t objectType, const std::vector<VtTAttributeRows>& parts, Names names = Names::exact);
    VtCAttributeTable(const VtCAttributeTable&) = delete;
    VtCAttributeTable& operator=(const VtCAttributeTable&) = delete;

    std::int32_t GetObjectType() const { return objectType; }
    const VtTAttributeRows& GetRows() const { return rows; }

    /// Null for a name that the class doesn't know.
    const VtTAttributeRow* Find(std::wstring_view name) const;

    /// Brings `value` into `owner`; a value of another type or length than the attribute's is ignored. False for a
    /// name that the class doesn't know.
    bool Take(VtIRecordOwner& owner, std::wstring_view name, const VtTAttributeValue& value) const;

    /// A new record with all that new records hold; null when that is nothing.
    osg::ref_ptr<VtISceneObject> MakeRecord() const;

private:
    // Names differ in their ends and lengths, so a few letters part them. A whole hash would be most of a dispatch.
    struct Hash
    {
        std::size_t operator()(std::wstring_view name) const;
    };
    struct Equal
    {
        bool anyCase;
        bool operator()(std::wstring_view a, std::wstring_view b) const;
    };

    std::int32_t objectType;
    VtTAttributeRows rows;
    std::unordered_map<std::wstring_view, std::size_t, Hash, Equal> byName;
};

/// What every record holds besides the values of its class. `name` is the row of the class, or kept.
VtTAttributeRows IdentityRows(std::int32_t objectType, VtTAttributeRow name);
