#include "records/ObjectElement.h"
#include "records/AttributeNames.h"

#include "base/Numbers.h"
#include "base/Text.h"
#include "records/RecordTables.h"

#include <algorithm>
#include <cstdint>
#include <limits>
#include <optional>
#include <utility>

#include <pugixml.hpp>

namespace
{

// Far above any record that somebody means; a text beyond them is a mistake or an attack on memory.
constexpr std::size_t mostAttributes = 100000;
constexpr std::size_t largestValue = 16U << 20; // bytes

bool IsText(const pugi::xml_node& node)
{
    return node.type() == pugi::node_pcdata || node.type() == pugi::node_cdata;
}

std::int32_t ReadType(const pugi::xml_node& node, const pugi::xml_attribute& type)
{
    const std::optional<std::int64_t> number = base::ParseInteger(type.value());
    if (!number || *number < 0 || *number > std::numeric_limits<std::int32_t>::max())
        RefuseNode(node, "\"" + Shortened(type.value()) + "\" is not a type of objects");
    return static_cast<std::int32_t>(*number);
}

// Text may be interrupted by comments and CDATA sections; together they are one text.
std::string ReadText(const pugi::xml_node& element)
{
    std::string text;
    for (const pugi::xml_node& part : element.children())
        if (IsText(part))
            text += part.value();
        else if (IsElement(part))
            RefuseContent(part);
    if (text.size() > largestValue)
        RefuseNode(element, "a value is larger than 16 MB");
    return text;
}

VtEAttributeType ReadAttributeType(const pugi::xml_node& node, const VtTAttributeRules& rules)
{
    const pugi::xml_attribute told = node.attribute("type");
    if (!told)
        return rules.assumedType;
    const VtEAttributeType type = AttributeTypeFromName(told.value());
    if (rules.fixedType && *rules.fixedType != type)
        throw VtCAttributeError("its type is " + std::string(AttributeTypeName(*rules.fixedType)) + ", not " +
                                told.value());
    return type;
}

// The text of an element that holds one piece of text, as nearly all do; null for others.
const char* PlainText(const pugi::xml_node& element)
{
    const pugi::xml_node only = element.first_child();
    if (!only)
        return "";
    return only.type() == pugi::node_pcdata && !only.next_sibling() ? only.value() : nullptr;
}

VtTAttributeValue ReadValue(const pugi::xml_node& node, VtEAttributeType type)
{
    const pugi::xml_node first = node.first_child();
    if (type != VtEAttributeType::textList && IsElement(first) && !first.next_sibling() &&
        std::string_view(first.name()) == "vtattr:value")
        if (const char* text = PlainText(first); text && std::string_view(text).size() <= largestValue)
            return AttributeValueFromText(type, text);

    std::vector<std::string> values;
    for (const pugi::xml_node& child : node.children())
        if (IsElement(child) && std::string_view(child.name()) == "vtattr:value")
            values.push_back(ReadText(child));
        else if (IsElement(child) || IsLooseText(child))
            RefuseContent(child);

    if (type == VtEAttributeType::textList)
    {
        std::vector<std::wstring> texts;
        texts.reserve(values.size());
        for (const std::string& value : values)
            texts.push_back(base::Wide(value));
        return texts;
    }
    if (values.size() != 1)
        throw VtCAttributeError("it has " + std::to_string(values.size()) + " values, not 1");
    return AttributeValueFromText(type, values.front());
}

// A carriage return stays one only as a reference: readers of XML make a line end of it. So do line ends in quotes.
bool NeedsReference(char c, bool inQuotes)
{
    if (c > '>')
        return false;
    if (static_cast<unsigned char>(c) < 0x20)
        return inQuotes || (c != '\t' && c != '\n');
    return c == '&' || c == '<' || c == '>' || (c == '"' && inQuotes);
}

void AppendReference(std::string& text, char c)
{
    switch (c)
    {
    case '&':
        text += "&amp;";
        break;
    case '<':
        text += "&lt;";
        break;
    case '>':
        text += "&gt;";
        break;
    case '"':
        text += "&quot;";
        break;
    case '\0':
        text += "\xEF\xBF\xBD";
        break;
    default:
        text += "&#" + std::to_string(static_cast<int>(c)) + ';';
    }
}

void AppendEscaped(std::string& text, std::string_view value, bool inQuotes)
{
    for (auto at = value.begin(); at != value.end();)
    {
        const auto next = std::find_if(at, value.end(), [inQuotes](char c) { return NeedsReference(c, inQuotes); });
        text.append(at, next);
        if (next == value.end())
            return;
        AppendReference(text, *next);
        at = next + 1;
    }
}

void AppendTextValue(std::string& text, const std::wstring& value)
{
    text += "<vtattr:value>";
    AppendEscaped(text, base::Utf8(value), false);
    text += "</vtattr:value>";
}

} // namespace

bool IsElement(const pugi::xml_node& node)
{
    return node.type() == pugi::node_element;
}

bool IsLooseText(const pugi::xml_node& node)
{
    return IsText(node) && !base::Trim(node.value()).empty();
}

std::string Shortened(const char* text)
{
    constexpr std::size_t longest = 60;
    const std::string_view whole(text);
    return base::Utf8(base::Wide(whole.substr(0, longest))) + (whole.size() > longest ? "..." : "");
}

void RefuseNode(const pugi::xml_node& node, const std::string& reason)
{
    throw VtTTextFault{node.offset_debug(), reason};
}

void RefuseContent(const pugi::xml_node& node)
{
    if (IsElement(node))
        RefuseNode(node, "element <" + Shortened(node.name()) + "> is not expected here");
    RefuseNode(node, "text \"" + Shortened(node.value()) + "\" is not expected here");
}

void RefuseDocumentTypes(const pugi::xml_node& document)
{
    for (const pugi::xml_node& node : document.children())
        if (node.type() == pugi::node_doctype)
            throw VtTTextFault{0, "a document type is not allowed"};
}

const VtTAttributeRules& VtCObjectReader::RulesOf(std::string_view name)
{
    const auto at = rules.find(name);
    if (at != rules.end())
        return at->second;
    const std::wstring wide = base::Wide(name);
    VtTAttributeRules made{ShareAttributeName(wide), FixedAttributeType(wide), AssumedAttributeType(wide),
                           FixedListLength(wide)};
    return rules.emplace(name, std::move(made)).first->second;
}

void VtCObjectReader::ReadAttribute(const pugi::xml_node& node, VtISceneObject& object)
{
    const VtTAttributeRules& rulesOfName = RulesOf(node.attribute("name").value());
    if (rulesOfName.name->empty())
        RefuseNode(node, "an attribute has no name");
    if (object.GetAttributes().size() >= mostAttributes)
        RefuseNode(node, "more than " + std::to_string(mostAttributes) + " attributes");
    bool isNew = false;
    try
    {
        VtTAttributeValue value = ReadValue(node, ReadAttributeType(node, rulesOfName));
        const auto* list = std::get_if<std::vector<float>>(&value);
        const std::optional<std::size_t> length = list ? rulesOfName.fixedLength : std::nullopt;
        if (length && list->size() != *length)
            throw VtCAttributeError("it holds " + std::to_string(list->size()) + " numbers, not " +
                                    std::to_string(*length));
        isNew = object.AddNewAttribute(rulesOfName.name, std::move(value));
    }
    catch (const VtCAttributeError& error)
    {
        RefuseNode(node, "attribute \"" + Shortened(node.attribute("name").value()) + "\": " + error.what());
    }
    if (!isNew)
        RefuseNode(node, "attribute \"" + Shortened(node.attribute("name").value()) + "\" is there twice");
}

osg::ref_ptr<VtISceneObject> VtCObjectReader::Read(const pugi::xml_node& element, const pugi::xml_node& parent,
                                                   bool isWhole)
{
    osg::ref_ptr<VtISceneObject> object = new VtISceneObject;
    std::optional<std::int32_t> type;
    if (const pugi::xml_attribute told = element.attribute("type"))
        type = ReadType(element, told);
    for (const pugi::xml_node& node : parent.children())
        if (IsElement(node) && std::string_view(node.name()) == "vtattr:Attribute")
            ReadAttribute(node, *object);
        else if (IsElement(node) || IsLooseText(node))
            RefuseContent(node);

    if (isWhole && object->GetAttributes().empty())
        RefuseNode(element, "the object has no attributes");
    const std::int32_t* stored = object->Find<std::int32_t>(attribute::objectType);
    if (type && stored && *type != *stored)
        RefuseNode(element, "the type of the object is " + std::to_string(*type) + ", but its object_type is " +
                                std::to_string(*stored));
    if (!type && !stored && isWhole)
        RefuseNode(element, "the object has no type");
    object->SetObjectType(type ? *type : stored ? *stored : std::int32_t{objectTypeStaticBody});
    object->Write(attribute::objectType, object->GetObjectType());
    return object;
}

void VtCObjectWriter::Write(std::string& text, const VtISceneObject& object, std::size_t indent, bool declaresNamespace)
{
    text.append(indent, ' ') += "<vtattr:Object";
    if (declaresNamespace)
        (text += " xmlns:vtattr=\"") += attributesNamespace + std::string("\"");
    text += " type=\"" + std::to_string(object.GetObjectType()) + "\">\n";
    StartTags& tags = startTags[object.GetObjectType()];
    tags.resize(std::max(tags.size(), object.GetAttributes().size()));
    auto tag = tags.begin();
    for (const osg::ref_ptr<VtISceneAttribute>& attribute : object.GetAttributes())
    {
        text.append(indent + 2, ' ') += StartTag(*tag++, *attribute);
        const VtTAttributeValue& value = attribute->GetValue();
        if (const auto* texts = std::get_if<std::vector<std::wstring>>(&value))
            for (const std::wstring& entry : *texts)
                AppendTextValue(text, entry);
        else if (const auto* one = std::get_if<std::wstring>(&value))
            AppendTextValue(text, *one);
        else
            text.append("<vtattr:value>").append(AttributeValueToUtf8(value)) += "</vtattr:value>";
        text += "</vtattr:Attribute>\n";
    }
    text.append(indent, ' ') += "</vtattr:Object>\n";
}

const std::string& VtCObjectWriter::StartTag(VtTStartTag& tag, const VtISceneAttribute& attribute)
{
    if (tag.name != &attribute.GetName() || tag.type != attribute.GetType())
    {
        tag = {&attribute.GetName(), attribute.GetType(), "<vtattr:Attribute name=\""};
        AppendEscaped(tag.text, base::Utf8(attribute.GetName()), true);
        tag.text.append("\" type=\"").append(AttributeTypeName(attribute.GetType())) += "\">";
    }
    return tag.text;
}

std::ptrdiff_t LineOf(std::ptrdiff_t offset, std::string_view text)
{
    const std::size_t end = std::min(static_cast<std::size_t>(std::max<std::ptrdiff_t>(offset, 0)), text.size());
    return 1 + std::count(text.begin(), text.begin() + static_cast<std::ptrdiff_t>(end), '\n');
}

std::string DescribeFault(const VtTTextFault& fault, std::string_view text)
{
    return "line " + std::to_string(LineOf(fault.offset, text)) + ": " + fault.reason;
}
