#pragma once

#include <array>
#include <cstdint>
#include <memory>
#include <stdexcept>
#include <string>
#include <string_view>
#include <variant>
#include <vector>

#include <osg/Referenced>

class VtISceneObject;

using VtTFloatTupel3 = std::array<float, 3>;
using VtTIntTupel3 = std::array<std::int32_t, 3>;

/// The value of an attribute. Truth values are the integers 0 and 1.
using VtTAttributeValue = std::variant<std::int32_t, float, std::wstring, VtTFloatTupel3, VtTIntTupel3,
                                       std::vector<float>, std::vector<std::wstring>>;

/// Kinds of attributes, numbered as the alternatives of `VtTAttributeValue`.
enum class VtEAttributeType
{
    integer,     ///< "int"
    real,        ///< "float"
    text,        ///< "string"
    floatTupel3, ///< "floatTupel3"
    intTupel3,   ///< "intTupel3"
    floatList,   ///< "floatList"
    textList,    ///< "stringList"
};

/// What an attribute or a record refuses: an unknown type name, a text that isn't a value of the type, a value of
/// another type, a number that isn't finite. `what()` is UTF-8 for the user.
class VtCAttributeError : public std::runtime_error
{
public:
    using std::runtime_error::runtime_error;
};

/// The name of `type` in records, in UTF-8, and back; an unknown name throws `VtCAttributeError`.
std::string_view AttributeTypeName(VtEAttributeType type);
VtEAttributeType AttributeTypeFromName(std::string_view typeName);

/// The value that `text` stands for. Numbers are decimal with a point, those of a tuple or list separated by blanks;
/// a list of texts has one entry a line. Throws `VtCAttributeError` when `text` isn't such a value.
VtTAttributeValue AttributeValueFromText(VtEAttributeType type, std::wstring_view text);

/// The same for a text in UTF-8.
VtTAttributeValue AttributeValueFromText(VtEAttributeType type, std::string_view text);

/// The text that reads back as the same value; a list of texts only when no entry holds a line end.
std::wstring AttributeValueToText(const VtTAttributeValue& value);
std::string AttributeValueToUtf8(const VtTAttributeValue& value);

/// False for a value with numbers that aren't finite: no record could be read back with them.
bool IsStorable(const VtTAttributeValue& value);

/// The name of an attribute. All records share a few names, which take more room than most values.
using VtTAttributeName = std::shared_ptr<const std::wstring>;

/// The one copy of `name` that the attributes of this name share; a copy of its own if there are too many names.
VtTAttributeName ShareAttributeName(std::wstring_view name);

/// One named value of a record. The type is fixed when it is made.
class VtISceneAttribute : public osg::Referenced
{
public:
    VtISceneAttribute(VtTAttributeName attributeName, VtTAttributeValue attributeValue);

    const std::wstring& GetName() const { return *name; }
    VtEAttributeType GetType() const { return static_cast<VtEAttributeType>(value.index()); }
    std::wstring GetTypeName() const;
    const VtTAttributeValue& GetValue() const { return value; }
    std::wstring GetValueText() const { return AttributeValueToText(value); }

    /// How often the value has changed since the attribute was made.
    std::uint32_t GetChangeCount() const { return changes; }

    /// Stores `newValue` and, if it differs from the present one, tells the listeners of the record.
    ///
    /// An integer is taken for a float attribute; any other value of a foreign type throws `VtCAttributeError`, and
    /// so do numbers that aren't finite, since no record could be read back with them.
    void SetValue(VtTAttributeValue newValue);

private:
    friend class VtISceneObject;

    VtTAttributeName name;
    VtTAttributeValue value;
    std::uint32_t changes = 0;
    VtISceneObject* owner = nullptr; ///< null once the record has let it go
};
