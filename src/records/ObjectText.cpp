#include "records/ObjectText.h"

#include "base/Text.h"
#include "records/ObjectElement.h"

#include <string>

#include <pugixml.hpp>

namespace
{

// Far above any record that somebody means; a text beyond it is a mistake or an attack on memory.
constexpr std::size_t largestText = 64U << 20;

osg::ref_ptr<VtISceneObject> ReadObject(const pugi::xml_document& document)
{
    RefuseDocumentTypes(document);
    pugi::xml_node root;
    for (const pugi::xml_node& node : document.children())
        if (IsElement(node))
        {
            root = node;
            break;
        }
    if (!root)
        throw VtTTextFault{0, "there is no element"};
    if (std::string_view(root.name()) != objectElementName)
        return VtCObjectReader().Read({}, document, false);
    for (pugi::xml_node next = root.next_sibling(); next; next = next.next_sibling())
        if (IsElement(next))
            RefuseContent(next);
    return VtCObjectReader().Read(root, root, false);
}

} // namespace

VtTParsedObject ParseObjectText(const std::wstring& text)
{
    const std::string narrow = base::Utf8(text);
    const auto failed = [&](const VtTTextFault& fault) {
        return VtTParsedObject{nullptr, base::Wide(DescribeFault(fault, narrow))};
    };

    if (narrow.size() > largestText)
        return failed({0, "the text is larger than 64 MB"});

    pugi::xml_document document;
    const unsigned options = (pugi::parse_default | pugi::parse_ws_pcdata_single | pugi::parse_doctype) &
                             ~static_cast<unsigned>(pugi::parse_eol);
    const pugi::xml_parse_result result =
        document.load_buffer(narrow.data(), narrow.size(), options, pugi::encoding_utf8);
    if (!result)
        return failed({result.offset, result.description()});

    try
    {
        return {ReadObject(document), {}};
    }
    catch (const VtTTextFault& fault)
    {
        return failed(fault);
    }
}

std::wstring WriteObjectText(const VtISceneObject& object)
{
    std::string text;
    VtCObjectWriter().Write(text, object, 0, true);
    return base::Wide(text);
}
