#include "records/SceneFileText.h"
#include "records/AttributeNames.h"

#include "base/Text.h"
#include "records/ObjectElement.h"
#include "records/RecordTables.h"

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <unordered_map>

#include <pugixml.hpp>

namespace
{

constexpr std::string_view sceneVersion = "1";
constexpr std::string_view byteOrderMark = "\xEF\xBB\xBF";
constexpr int deepestElement = 4; // scene, object, attribute, value
constexpr int mostQuotes = 12;    // six XML attributes in one tag
constexpr std::size_t deepestAncestor = 1000;

constexpr std::string_view sceneElementName = "vtattr:Scene";
constexpr std::string_view elementNames[] = {"vtattr:value", "vtattr:Attribute", objectElementName,
                                             sceneElementName}; // frequent ones first

[[noreturn]] void Refuse(std::size_t at, const std::string& reason)
{
    throw VtTTextFault{static_cast<std::ptrdiff_t>(at), reason};
}

// Length of the UTF-8 sequence at `at`, 0 for bytes that are none. Neither surrogates nor overlong forms are any.
std::size_t SequenceLength(std::string_view text, std::size_t at)
{
    const auto byte = [&](std::size_t i)
    { return at + i < text.size() ? static_cast<unsigned char>(text[at + i]) : 0U; };
    const auto follows = [&](std::size_t i) { return (byte(i) & 0xC0U) == 0x80U; };
    const unsigned first = byte(0);
    if (first < 0x80)
        return first == 0 ? 0 : 1;
    if (first >= 0xC2 && first <= 0xDF && follows(1))
        return 2;
    if (first >= 0xE0 && first <= 0xEF && follows(1) && follows(2))
        return (first == 0xE0 && byte(1) < 0xA0) || (first == 0xED && byte(1) > 0x9F) ? 0 : 3;
    if (first >= 0xF0 && first <= 0xF4 && follows(1) && follows(2) && follows(3))
        return (first == 0xF0 && byte(1) < 0x90) || (first == 0xF4 && byte(1) > 0x8F) ? 0 : 4;
    return 0;
}

// The first place at or behind `at` that doesn't hold a byte from 1 to 127; 32 bytes at a time.
std::size_t EndOfAscii(std::string_view text, std::size_t at)
{
    constexpr std::uint64_t ones = 0x0101010101010101;
    constexpr std::uint64_t highBits = 0x8080808080808080;
    for (std::uint64_t words[4]; at + sizeof words <= text.size(); at += sizeof words)
    {
        std::memcpy(words, text.data() + at, sizeof words);
        std::uint64_t marks = 0;
        for (const std::uint64_t word : words)
            marks |= word | (word - ones); // the high bits are set by bytes from 128 up, and borrowed by bytes of 0
        if (marks & highBits)
            break;
    }
    while (at < text.size() && static_cast<signed char>(text[at]) > 0)
        ++at;
    return at;
}

void CheckEncoding(std::string_view text)
{
    if (text.starts_with("\xFF\xFE") || text.starts_with("\xFE\xFF") ||
        (text.size() > 1 && (text[0] == '\0') != (text[1] == '\0')))
        Refuse(0, "the text is UTF-16 or UTF-32, not UTF-8");
    for (std::size_t at = 0; at < text.size();)
    {
        // Nearly all of a file; byte by byte through the rules it would cost as much as the parsing.
        at = EndOfAscii(text, at);
        if (at == text.size())
            return;
        const std::size_t length = SequenceLength(text, at);
        if (length == 0)
            Refuse(at, text[at] == '\0' ? "there is a byte 0" : "the text is not UTF-8");
        at += length;
    }
}

/// Looks at the tags alone before a tree is made of the text, so that a text of another kind costs no memory: elements
/// of other names, deep nesting and tags of thousands of attributes would take many times their own size.
class TagCheck
{
public:
    explicit TagCheck(std::string_view wholeText) : text(wholeText) {}

    void Run()
    {
        for (std::size_t at = text.find('<'); at != std::string_view::npos; at = text.find('<', at))
            at = Pass(at);
    }

private:
    std::size_t Pass(std::size_t at)
    {
        const char next = at + 1 < text.size() ? text[at + 1] : '\0';
        if (next == '!' || next == '?')
            return PassOther(at);

        const bool closes = next == '/';
        const std::size_t nameAt = at + (closes ? 2 : 1);
        const auto endsName = [](char c)
        { return c == ' ' || c == '\t' || c == '\r' || c == '\n' || c == '/' || c == '>'; };
        const auto known = std::find_if(std::begin(elementNames), std::end(elementNames),
                                        [&](std::string_view element)
                                        {
                                            const std::size_t end = nameAt + element.size();
                                            return text.substr(nameAt, element.size()) == element &&
                                                   (end >= text.size() || endsName(text[end]));
                                        });
        if (known == std::end(elementNames))
        {
            const auto begin = text.begin() + static_cast<std::ptrdiff_t>(std::min(nameAt, text.size()));
            const std::string other(begin, std::find_if(begin, text.end(), endsName));
            Refuse(at, "element <" + Shortened(other.substr(0, 100).c_str()) + "> is not expected here");
        }
        const std::string_view name = *known;
        const std::size_t nameEnd = nameAt + name.size();
        if (closes)
            --depth;
        else if (++depth > deepestElement)
            Refuse(at, "element <" + std::string(name) + "> is nested too deeply");
        return EndOfTag(at, nameEnd);
    }

    std::size_t PassOther(std::size_t at) const
    {
        const std::string_view rest = text.substr(at);
        if (rest.starts_with("<!--"))
            return Behind("-->", at + 4);
        if (rest.starts_with("<![CDATA["))
            return Behind("]]>", at + 9);
        if (rest.starts_with("<?"))
            return Behind("?>", at + 2);
        Refuse(at, "a document type is not allowed");
    }

    // A ">" in quotes belongs to a value.
    std::size_t EndOfTag(std::size_t tag, std::size_t at)
    {
        int quotes = 0;
        for (std::size_t end; (end = text.find('>', at)) != std::string_view::npos;)
        {
            const std::string_view part = text.substr(at, end - at);
            const std::size_t quote = std::min(part.find('"'), part.find('\''));
            if (quote == std::string_view::npos)
            {
                if (text[end - 1] == '/')
                    --depth;
                return end + 1;
            }
            if ((quotes += 2) > mostQuotes)
                Refuse(tag, "a tag has too many XML attributes");
            at = text.find(part[quote], at + quote + 1);
            if (at == std::string_view::npos)
                break;
            ++at;
        }
        Refuse(tag, "the text ends within a tag");
    }

    std::size_t Behind(std::string_view end, std::size_t from) const
    {
        const std::size_t at = text.find(end, from);
        if (at == std::string_view::npos)
            Refuse(from, "the text ends before \"" + std::string(end) + '"');
        return at + end.size();
    }

    std::string_view text;
    int depth = 0;
};

/// What the records of one file must keep to among themselves.
class RecordCheck
{
public:
    explicit RecordCheck(std::string_view wholeText) : text(wholeText) {}

    void Add(const VtISceneObject& object, std::ptrdiff_t offset)
    {
        const auto* id = object.Find<std::wstring>(attribute::internalId);
        if (!id || id->empty())
            return;
        const auto [at, isNew] = records.try_emplace(*id, Record{offset, {}, 0});
        if (!isNew)
            throw VtTTextFault{offset, "a record of the id \"" + Shortened(base::Utf8(*id).c_str()) +
                                           "\" is there already, in line " +
                                           std::to_string(LineOf(at->second.offset, text))};
        if (object.GetObjectType() == objectTypeStaticBody)
            if (const auto* parent = object.Find<std::wstring>(attribute::parentObjectId))
                at->second.parent = *parent;
    }

    // Each record is passed once: where a known level is reached, the rest of the way is known.
    void CheckAncestors()
    {
        for (auto& [id, record] : records)
        {
            std::vector<Record*> way;
            Record* next = &record;
            for (; next && next->level == 0; next = Parent(*next))
            {
                next->level = onTheWay;
                way.push_back(next);
            }
            if (next && next->level == onTheWay)
                throw VtTTextFault{next->offset, "a static body is its own parent, or one of its parent's parents"};
            std::size_t level = next ? next->level : 0;
            for (auto at = way.rbegin(); at != way.rend(); ++at)
                if (((*at)->level = ++level) > deepestAncestor)
                    throw VtTTextFault{(*at)->offset, "static bodies are nested deeper than " +
                                                          std::to_string(deepestAncestor) + " levels"};
        }
    }

private:
    static constexpr std::size_t onTheWay = static_cast<std::size_t>(-1);

    struct Record
    {
        std::ptrdiff_t offset;
        std::wstring parent;
        std::size_t level; ///< 0: not looked at yet
    };

    Record* Parent(const Record& record)
    {
        const auto at = record.parent.empty() ? records.end() : records.find(record.parent);
        return at == records.end() ? nullptr : &at->second;
    }

    std::string_view text;
    std::unordered_map<std::wstring, Record, base::NoCaseHash, base::NoCaseEqual> records;
};

pugi::xml_node FindScene(const pugi::xml_document& document)
{
    pugi::xml_node scene;
    for (const pugi::xml_node& node : document.children())
        if (node.type() == pugi::node_declaration)
        {
            const pugi::xml_attribute encoding = node.attribute("encoding");
            if (encoding && !base::EqualsNoCase(base::Wide(encoding.value()), L"utf-8"))
                throw VtTTextFault{0, "the encoding \"" + Shortened(encoding.value()) + "\" is not UTF-8"};
        }
        else if (IsElement(node))
        {
            if (scene || node.name() != sceneElementName)
                RefuseContent(node);
            scene = node;
        }
    if (!scene)
        throw VtTTextFault{0, "there is no scene"};
    if (const pugi::xml_attribute version = scene.attribute("version"); version.value() != sceneVersion)
        RefuseNode(scene, "the version \"" + Shortened(version.value()) + "\" of the scene is not known");
    return scene;
}

void ReadScene(std::string_view text, std::vector<osg::ref_ptr<VtISceneObject>>& objects)
{
    pugi::xml_document document;
    const unsigned options = (pugi::parse_default | pugi::parse_ws_pcdata_single | pugi::parse_declaration) &
                             ~static_cast<unsigned>(pugi::parse_eol);
    const pugi::xml_parse_result result = document.load_buffer(text.data(), text.size(), options, pugi::encoding_utf8);
    if (!result)
        throw VtTTextFault{result.offset, result.description()};

    VtCObjectReader reader;
    RecordCheck check(text);
    for (const pugi::xml_node& node : FindScene(document).children())
        if (IsElement(node) && std::string_view(node.name()) == objectElementName)
        {
            objects.push_back(reader.Read(node, node, true));
            check.Add(*objects.back(), node.offset_debug());
        }
        else if (IsElement(node) || IsLooseText(node))
            RefuseContent(node);
    check.CheckAncestors();
}

} // namespace

VtTSceneRecords ParseSceneText(std::string_view text)
{
    if (text.starts_with(byteOrderMark))
        text.remove_prefix(byteOrderMark.size());
    VtTSceneRecords records;
    try
    {
        if (text.size() > largestSceneText)
            Refuse(0, "the text is larger than 512 MB");
        CheckEncoding(text);
        TagCheck(text).Run();
        ReadScene(text, records.objects);
    }
    catch (const VtTTextFault& fault)
    {
        records.objects.clear();
        records.error = DescribeFault(fault, text);
    }
    return records;
}

std::string WriteSceneText(const std::vector<osg::ref_ptr<VtISceneObject>>& objects)
{
    constexpr std::size_t usualRecord = 2500; // bytes
    std::string text;
    text.reserve((objects.size() + 1) * usualRecord);
    text = "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<vtattr:Scene xmlns:vtattr=\"";
    text += attributesNamespace;
    text.append("\" version=\"").append(sceneVersion) += "\">\n";
    VtCObjectWriter writer;
    for (const osg::ref_ptr<VtISceneObject>& object : objects)
        writer.Write(text, *object, 2, false);
    return text += "</vtattr:Scene>\n";
}
