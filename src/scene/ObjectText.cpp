#include "scene/ObjectText.h"

#include "base/Numbers.h"
#include "base/Text.h"
#include "scene/RecordTables.h"

#include <algorithm>
#include <cstdint>
#include <limits>
#include <optional>
#include <string_view>
#include <utility>

#include <pugixml.hpp>

namespace
{

constexpr const char* namespaceUri = "urn:panoramic:attributes";

// Far above any record that somebody means; a text beyond them is a mistake or an attack on memory.
constexpr std::size_t largestText = 64U << 20;
constexpr std::size_t mostAttributes = 100000;

/// What is wrong, at a byte of the text.
struct Fault
{
    std::ptrdiff_t offset;
    std::string reason;
};

bool IsElement(const pugi::xml_node& node)
{
    return node.type() == pugi::node_element;
}

bool IsText(const pugi::xml_node& node)
{
    return node.type() == pugi::node_pcdata || node.type() == pugi::node_cdata;
}

std::string Shortened(const char* text)
{
    constexpr std::size_t longest = 60;
    const std::string_view whole(text);
    return std::string(whole.substr(0, longest)) + (whole.size() > longest ? "..." : "");
}

[[noreturn]] void Refuse(const pugi::xml_node& node, const std::string& reason)
{
    throw Fault{node.offset_debug(), reason};
}

[[noreturn]] void RefuseContent(const pugi::xml_node& node)
{
    if (IsElement(node))
        Refuse(node, "element <" + Shortened(node.name()) + "> is not expected here");
    Refuse(node, "text \"" + Shortened(node.value()) + "\" is not expected here");
}

std::int32_t ReadType(const pugi::xml_node& node, const pugi::xml_attribute& type)
{
    const std::optional<std::int64_t> number = base::ParseInteger(type.value());
    if (!number || *number < 0 || *number > std::numeric_limits<std::int32_t>::max())
        Refuse(node, "\"" + Shortened(type.value()) + "\" is not a type of objects");
    return static_cast<std::int32_t>(*number);
}

// Text may be interrupted by comments and CDATA sections; together they are one text.
std::wstring ReadText(const pugi::xml_node& element)
{
    std::string text;
    for (const pugi::xml_node& part : element.children())
        if (IsText(part))
            text += part.value();
        else if (IsElement(part))
            RefuseContent(part);
    return base::Wide(text);
}

VtEAttributeType ReadAttributeType(const pugi::xml_node& node, const std::wstring& name)
{
    const pugi::xml_attribute told = node.attribute("type");
    if (!told)
        return AssumedAttributeType(name);
    const VtEAttributeType type = AttributeTypeFromName(base::Wide(told.value()));
    const std::optional<VtEAttributeType> fixed = FixedAttributeType(name);
    if (fixed && *fixed != type)
        throw VtCAttributeError("its type is " + base::Utf8(AttributeTypeName(*fixed)) + ", not " + told.value());
    return type;
}

VtTAttributeValue ReadValue(const pugi::xml_node& node, VtEAttributeType type)
{
    std::vector<std::wstring> values;
    for (const pugi::xml_node& child : node.children())
        if (IsElement(child) && std::string_view(child.name()) == "vtattr:value")
            values.push_back(ReadText(child));
        else if (IsElement(child) || (IsText(child) && !base::Trim(child.value()).empty()))
            RefuseContent(child);

    if (type == VtEAttributeType::textList)
        return values;
    if (values.size() != 1)
        throw VtCAttributeError("it has " + std::to_string(values.size()) + " values, not 1");
    return AttributeValueFromText(type, values.front());
}

void ReadAttribute(const pugi::xml_node& node, VtISceneObject& object)
{
    const std::wstring name = base::Wide(node.attribute("name").value());
    if (name.empty())
        Refuse(node, "an attribute has no name");
    if (object.GetAttribute(name))
        Refuse(node, "attribute \"" + Shortened(node.attribute("name").value()) + "\" is there twice");
    if (object.GetAttributes().size() >= mostAttributes)
        Refuse(node, "more than " + std::to_string(mostAttributes) + " attributes");
    try
    {
        object.AddAttribute(name, ReadValue(node, ReadAttributeType(node, name)));
    }
    catch (const VtCAttributeError& error)
    {
        Refuse(node, "attribute \"" + Shortened(node.attribute("name").value()) + "\": " + error.what());
    }
}

void ReadAttributes(const pugi::xml_node& parent, VtISceneObject& object)
{
    for (const pugi::xml_node& node : parent.children())
        if (IsElement(node) && std::string_view(node.name()) == "vtattr:Attribute")
            ReadAttribute(node, object);
        else if (IsElement(node) || (IsText(node) && !base::Trim(node.value()).empty()))
            RefuseContent(node);
}

osg::ref_ptr<VtISceneObject> ReadObject(const pugi::xml_document& document)
{
    osg::ref_ptr<VtISceneObject> object = new VtISceneObject;
    pugi::xml_node root;
    for (const pugi::xml_node& node : document.children())
        if (IsElement(node))
        {
            root = node;
            break;
        }
    if (!root)
        throw Fault{0, "there is no element"};

    std::optional<std::int32_t> type;
    if (std::string_view(root.name()) == "vtattr:Object")
    {
        if (const pugi::xml_attribute told = root.attribute("type"))
            type = ReadType(root, told);
        for (pugi::xml_node next = root.next_sibling(); next; next = next.next_sibling())
            if (IsElement(next))
                RefuseContent(next);
        ReadAttributes(root, *object);
    }
    else
        ReadAttributes(document, *object);

    const std::int32_t* stored = object->Find<std::int32_t>(L"object_type");
    if (type && stored && *type != *stored)
        Refuse(root, "the type of the object is " + std::to_string(*type) + ", but its object_type is " +
                         std::to_string(*stored));
    object->SetObjectType(type ? *type : stored ? *stored : std::int32_t{objectTypeStaticBody});
    object->Write(L"object_type", object->GetObjectType());
    return object;
}

class StringWriter : public pugi::xml_writer
{
public:
    void write(const void* data, std::size_t size) override { text.append(static_cast<const char*>(data), size); }

    std::string text;
};

void AppendValue(pugi::xml_node& attribute, const std::wstring& value)
{
    attribute.append_child("vtattr:value").text().set(base::Utf8(value).c_str());
}

} // namespace

VtTParsedObject ParseObjectText(const std::wstring& text)
{
    const std::string narrow = base::Utf8(text);
    const auto failed = [&](const Fault& fault)
    {
        const std::size_t end =
            std::min(static_cast<std::size_t>(std::max<std::ptrdiff_t>(fault.offset, 0)), narrow.size());
        const auto line = 1 + std::count(narrow.begin(), narrow.begin() + static_cast<std::ptrdiff_t>(end), '\n');
        return VtTParsedObject{nullptr, base::Wide("line " + std::to_string(line) + ": " + fault.reason)};
    };

    if (narrow.size() > largestText)
        return failed({0, "the text is larger than 64 MB"});

    // No document type: entities of its own are never expanded, so a record that has one is refused whole.
    pugi::xml_document document;
    const unsigned options = (pugi::parse_default | pugi::parse_ws_pcdata_single | pugi::parse_doctype) &
                             ~static_cast<unsigned>(pugi::parse_eol);
    const pugi::xml_parse_result result =
        document.load_buffer(narrow.data(), narrow.size(), options, pugi::encoding_utf8);
    if (!result)
        return failed({result.offset, result.description()});

    try
    {
        for (const pugi::xml_node& node : document.children())
            if (node.type() == pugi::node_doctype)
                throw Fault{0, "a document type is not allowed"};
        return {ReadObject(document), {}};
    }
    catch (const Fault& fault)
    {
        return failed(fault);
    }
}

std::wstring WriteObjectText(const VtISceneObject& object)
{
    pugi::xml_document document;
    pugi::xml_node root = document.append_child("vtattr:Object");
    root.append_attribute("xmlns:vtattr") = namespaceUri;
    root.append_attribute("type") = object.GetObjectType();
    for (const osg::ref_ptr<VtISceneAttribute>& attribute : object.GetAttributes())
    {
        pugi::xml_node node = root.append_child("vtattr:Attribute");
        node.append_attribute("name") = base::Utf8(attribute->GetName()).c_str();
        node.append_attribute("type") = base::Utf8(attribute->GetTypeName()).c_str();
        if (const auto* texts = std::get_if<std::vector<std::wstring>>(&attribute->GetValue()))
            for (const std::wstring& text : *texts)
                AppendValue(node, text);
        else
            AppendValue(node, attribute->GetValueText());
    }
    StringWriter writer;
    document.save(writer, "  ", pugi::format_indent | pugi::format_no_declaration, pugi::encoding_utf8);
    return base::Wide(writer.text);
}
