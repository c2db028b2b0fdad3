#include "records/SceneAttribute.h"

#include "base/Numbers.h"
#include "base/Text.h"
#include "records/SceneObject.h"

#include <algorithm>
#include <cmath>
#include <limits>
#include <optional>
#include <unordered_map>
#include <utility>

namespace
{

constexpr std::string_view typeNames[] = {"int",       "float",     "string",    "floatTupel3",
                                          "intTupel3", "floatList", "stringList"};

[[noreturn]] void Refuse(const std::string& reason)
{
    throw VtCAttributeError(reason);
}

// Long texts are cut: they come from files and go into messages.
std::string Quoted(std::string_view text)
{
    constexpr std::size_t longest = 60;
    return '"' + base::Utf8(base::Wide(text.substr(0, longest))) + (text.size() > longest ? "...\"" : "\"");
}

std::int32_t IntegerFromText(std::string_view text)
{
    const std::optional<std::int64_t> number = base::ParseInteger(text);
    if (!number)
        Refuse(Quoted(text) + " is not an integer");
    if (*number < std::numeric_limits<std::int32_t>::min() || *number > std::numeric_limits<std::int32_t>::max())
        Refuse(Quoted(text) + " does not fit into 32 bits");
    return static_cast<std::int32_t>(*number);
}

float RealFromText(std::string_view text)
{
    const std::optional<float> number = base::ParseFloat(text);
    if (!number)
        Refuse(Quoted(text) + " is not a number");
    if (!std::isfinite(*number))
        Refuse(Quoted(text) + " is too large");
    return *number;
}

template <class Take>
void ForEachWord(std::string_view text, Take take)
{
    const auto isBlank = [](char c) { return c == ' ' || c == '\t' || c == '\r' || c == '\n'; };
    for (auto begin = std::find_if_not(text.begin(), text.end(), isBlank); begin != text.end();)
    {
        const auto end = std::find_if(begin, text.end(), isBlank);
        take(std::string_view(begin, end));
        begin = std::find_if_not(end, text.end(), isBlank);
    }
}

template <class Tuple, class Convert>
Tuple TupleFromText(std::string_view text, Convert convert)
{
    Tuple tuple{};
    std::size_t count = 0;
    ForEachWord(text,
                [&](std::string_view word)
                {
                    if (count < tuple.size())
                        tuple[count] = convert(word);
                    ++count;
                });
    if (count != tuple.size())
        Refuse(Quoted(text) + " holds " + std::to_string(count) + " numbers, not 3");
    return tuple;
}

template <class Numbers, class Format>
std::string NumbersToText(const Numbers& numbers, Format format)
{
    std::string text;
    for (const auto number : numbers)
        (text.empty() ? text : text += ' ') += format(number);
    return text;
}

std::wstring Lines(const std::vector<std::wstring>& texts)
{
    std::wstring lines;
    for (std::size_t i = 0; i < texts.size(); ++i)
        (i == 0 ? lines : lines += L'\n') += texts[i];
    return lines;
}

struct ToUtf8
{
    std::string operator()(std::int32_t number) const { return std::to_string(number); }
    std::string operator()(float number) const { return base::FormatFloat(number); }
    std::string operator()(const std::wstring& text) const { return base::Utf8(text); }
    std::string operator()(const VtTFloatTupel3& numbers) const { return NumbersToText(numbers, base::FormatFloat); }
    std::string operator()(const VtTIntTupel3& numbers) const
    {
        return NumbersToText(numbers, [](std::int32_t number) { return std::to_string(number); });
    }
    std::string operator()(const std::vector<float>& numbers) const
    {
        return NumbersToText(numbers, base::FormatFloat);
    }
    std::string operator()(const std::vector<std::wstring>& texts) const { return base::Utf8(Lines(texts)); }
};

struct IsFinite
{
    bool operator()(float number) const { return std::isfinite(number); }
    bool operator()(const VtTFloatTupel3& numbers) const { return All(numbers); }
    bool operator()(const std::vector<float>& numbers) const { return All(numbers); }
    template <class Other>
    bool operator()(const Other&) const
    {
        return true;
    }

    template <class Numbers>
    static bool All(const Numbers& numbers)
    {
        for (float number : numbers)
            if (!std::isfinite(number))
                return false;
        return true;
    }
};

void CheckFinite(const std::wstring& name, const VtTAttributeValue& value)
{
    if (!IsStorable(value))
        Refuse("attribute " + Quoted(base::Utf8(name)) + " takes finite numbers only");
}

} // namespace

std::string_view AttributeTypeName(VtEAttributeType type)
{
    return typeNames[static_cast<std::size_t>(type)];
}

VtEAttributeType AttributeTypeFromName(std::string_view typeName)
{
    for (std::size_t i = 0; i < std::size(typeNames); ++i)
        if (typeNames[i] == typeName)
            return static_cast<VtEAttributeType>(i);
    Refuse(Quoted(typeName) + " is not a type of attributes");
}

VtTAttributeValue AttributeValueFromText(VtEAttributeType type, std::wstring_view text)
{
    switch (type)
    {
    case VtEAttributeType::text:
        return std::wstring(text);
    case VtEAttributeType::textList:
        return base::Split(text, L'\n');
    default:
        return AttributeValueFromText(type, base::Utf8(text));
    }
}

VtTAttributeValue AttributeValueFromText(VtEAttributeType type, std::string_view text)
{
    switch (type)
    {
    case VtEAttributeType::text:
        return base::Wide(text);
    case VtEAttributeType::textList:
        return base::Split(base::Wide(text), L'\n');
    case VtEAttributeType::integer:
        return IntegerFromText(text);
    case VtEAttributeType::real:
        return RealFromText(text);
    case VtEAttributeType::floatTupel3:
        return TupleFromText<VtTFloatTupel3>(text, RealFromText);
    case VtEAttributeType::intTupel3:
        return TupleFromText<VtTIntTupel3>(text, IntegerFromText);
    default:
        constexpr std::size_t usualLength = 16; // a matrix
        std::vector<float> list;
        list.reserve(usualLength);
        ForEachWord(text, [&](std::string_view word) { list.push_back(RealFromText(word)); });
        return list;
    }
}

std::wstring AttributeValueToText(const VtTAttributeValue& value)
{
    if (const auto* text = std::get_if<std::wstring>(&value))
        return *text;
    if (const auto* texts = std::get_if<std::vector<std::wstring>>(&value))
        return Lines(*texts);
    return base::Wide(AttributeValueToUtf8(value));
}

std::string AttributeValueToUtf8(const VtTAttributeValue& value)
{
    return std::visit(ToUtf8(), value);
}

bool IsStorable(const VtTAttributeValue& value)
{
    return std::visit(IsFinite(), value);
}

VtTAttributeName ShareAttributeName(std::wstring_view name)
{
    constexpr std::size_t mostNames = 500; // they come from files too
    static std::unordered_map<std::wstring_view, VtTAttributeName> names;
    const auto at = names.find(name);
    if (at != names.end())
        return at->second;
    auto made = std::make_shared<const std::wstring>(name);
    if (names.size() < mostNames)
        names.emplace(*made, made);
    return made;
}

VtISceneAttribute::VtISceneAttribute(VtTAttributeName attributeName, VtTAttributeValue attributeValue)
    : name(std::move(attributeName)), value(std::move(attributeValue))
{
    if (name->empty())
        Refuse("an attribute needs a name");
    CheckFinite(*name, value);
}

std::wstring VtISceneAttribute::GetTypeName() const
{
    return base::Wide(AttributeTypeName(GetType()));
}

void VtISceneAttribute::SetValue(VtTAttributeValue newValue)
{
    if (value.index() != newValue.index())
    {
        const std::int32_t* integer = std::get_if<std::int32_t>(&newValue);
        if (!integer || GetType() != VtEAttributeType::real)
            Refuse("attribute " + Quoted(base::Utf8(*name)) + " is of type " + base::Utf8(GetTypeName()) +
                   " and takes no " + std::string(typeNames[newValue.index()]));
        newValue = static_cast<float>(*integer);
    }
    CheckFinite(*name, newValue);
    if (value == newValue)
        return;

    value = std::move(newValue);
    ++changes;
    if (owner)
        owner->Fire(*this);
}
