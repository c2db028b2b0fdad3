#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

#include <osg/ref_ptr>

#include "records/SceneObject.h"

namespace pugi
{
class xml_node;
}

/// One record as an XML element, as texts of single records and scene files share it. Inside this folder only.

/// What is wrong with a text, at a byte of it. Thrown by the functions that read.
struct VtTTextFault
{
    std::ptrdiff_t offset;
    std::string reason;
};

constexpr const char* attributesNamespace = "urn:panoramic:attributes";
constexpr const char* objectElementName = "vtattr:Object";

[[noreturn]] void RefuseNode(const pugi::xml_node& node, const std::string& reason);

/// Refuses `node` as an element or a text that has no place where it stands.
[[noreturn]] void RefuseContent(const pugi::xml_node& node);

bool IsElement(const pugi::xml_node& node);

/// A text that holds more than blanks and line ends.
bool IsLooseText(const pugi::xml_node& node);

/// Refuses document types: entities of a text's own are never expanded.
void RefuseDocumentTypes(const pugi::xml_node& document);

/// The first bytes of a text from outside, for a message.
std::string Shortened(const char* text);

/// What the name of an attribute says by itself.
struct VtTAttributeRules
{
    VtTAttributeName name;
    std::optional<VtEAttributeType> fixedType;
    VtEAttributeType assumedType; ///< when the text tells none
    std::optional<std::size_t> fixedLength;
};

/// Reads the records of one document, which outlives this.
class VtCObjectReader
{
public:
    /// The record whose attributes stand below `parent`. `element` is the `vtattr:Object` with its type, null for
    /// attributes without one. Without a type it is one of a static body; with `isWhole` it is refused, and so is a
    /// record without attributes.
    osg::ref_ptr<VtISceneObject> Read(const pugi::xml_node& element, const pugi::xml_node& parent, bool isWhole);

private:
    void ReadAttribute(const pugi::xml_node& node, VtISceneObject& object);
    const VtTAttributeRules& RulesOf(std::string_view name);

    std::unordered_map<std::string_view, VtTAttributeRules> rules; ///< keys lie in the document
};

/// Writes records that live as long as this does. What attributes of one name have in common is made once.
class VtCObjectWriter
{
public:
    /// Appends the element of `object` to `text`, indented by `indent` blanks, with the declaration of the namespace if
    /// asked for.
    void Write(std::string& text, const VtISceneObject& object, std::size_t indent, bool declaresNamespace);

private:
    struct VtTStartTag
    {
        const std::wstring* name = nullptr; ///< shared by attributes
        VtEAttributeType type = VtEAttributeType::integer;
        std::string text;
    };

    using StartTags = std::vector<VtTStartTag>; ///< by place in a record

    static const std::string& StartTag(VtTStartTag& tag, const VtISceneAttribute& attribute);

    std::unordered_map<std::int32_t, StartTags> startTags; ///< records of one type have their attributes in one order
};

/// The line of a byte of `text`, counted from 1.
std::ptrdiff_t LineOf(std::ptrdiff_t offset, std::string_view text);

/// "line 3: reason" for a fault in `text`.
std::string DescribeFault(const VtTTextFault& fault, std::string_view text);
