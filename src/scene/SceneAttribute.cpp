#include "scene/SceneAttribute.h"

#include "base/Numbers.h"
#include "base/Text.h"
#include "scene/SceneObject.h"

#include <cmath>
#include <limits>
#include <optional>
#include <utility>

namespace
{

constexpr std::wstring_view typeNames[] = {L"int",       L"float",     L"string",    L"floatTupel3",
                                           L"intTupel3", L"floatList", L"stringList"};

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
    constexpr std::string_view blanks = " \t\r\n";
    for (std::size_t begin = text.find_first_not_of(blanks); begin != std::string_view::npos;)
    {
        const std::size_t end = text.find_first_of(blanks, begin);
        take(text.substr(begin, end == std::string_view::npos ? end : end - begin));
        begin = text.find_first_not_of(blanks, end);
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
std::wstring NumbersToText(const Numbers& numbers, Format format)
{
    std::string text;
    for (const auto number : numbers)
        (text.empty() ? text : text += ' ') += format(number);
    return base::Wide(text);
}

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
    if (!std::visit(IsFinite(), value))
        Refuse("attribute " + Quoted(base::Utf8(name)) + " takes finite numbers only");
}

} // namespace

std::wstring_view AttributeTypeName(VtEAttributeType type)
{
    return typeNames[static_cast<std::size_t>(type)];
}

VtEAttributeType AttributeTypeFromName(std::wstring_view typeName)
{
    for (std::size_t i = 0; i < std::size(typeNames); ++i)
        if (typeNames[i] == typeName)
            return static_cast<VtEAttributeType>(i);
    Refuse(Quoted(base::Utf8(typeName)) + " is not a type of attributes");
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
        break;
    }

    const std::string narrow = base::Utf8(text);
    switch (type)
    {
    case VtEAttributeType::integer:
        return IntegerFromText(narrow);
    case VtEAttributeType::real:
        return RealFromText(narrow);
    case VtEAttributeType::floatTupel3:
        return TupleFromText<VtTFloatTupel3>(narrow, RealFromText);
    case VtEAttributeType::intTupel3:
        return TupleFromText<VtTIntTupel3>(narrow, IntegerFromText);
    default:
        std::vector<float> list;
        ForEachWord(narrow, [&](std::string_view word) { list.push_back(RealFromText(word)); });
        return list;
    }
}

std::wstring AttributeValueToText(const VtTAttributeValue& value)
{
    struct ToText
    {
        std::wstring operator()(std::int32_t number) const { return std::to_wstring(number); }
        std::wstring operator()(float number) const { return base::Wide(base::FormatFloat(number)); }
        std::wstring operator()(const std::wstring& text) const { return text; }
        std::wstring operator()(const VtTFloatTupel3& numbers) const
        {
            return NumbersToText(numbers, base::FormatFloat);
        }
        std::wstring operator()(const VtTIntTupel3& numbers) const
        {
            return NumbersToText(numbers, [](std::int32_t number) { return std::to_string(number); });
        }
        std::wstring operator()(const std::vector<float>& numbers) const
        {
            return NumbersToText(numbers, base::FormatFloat);
        }
        std::wstring operator()(const std::vector<std::wstring>& texts) const
        {
            std::wstring lines;
            for (std::size_t i = 0; i < texts.size(); ++i)
                (i == 0 ? lines : lines += L'\n') += texts[i];
            return lines;
        }
    };
    return std::visit(ToText(), value);
}

VtISceneAttribute::VtISceneAttribute(std::wstring attributeName, VtTAttributeValue attributeValue)
    : name(std::move(attributeName)), value(std::move(attributeValue))
{
    if (name.empty())
        Refuse("an attribute needs a name");
    CheckFinite(name, value);
}

void VtISceneAttribute::SetValue(VtTAttributeValue newValue)
{
    if (value.index() != newValue.index())
    {
        const std::int32_t* integer = std::get_if<std::int32_t>(&newValue);
        if (!integer || GetType() != VtEAttributeType::real)
            Refuse("attribute " + Quoted(base::Utf8(name)) + " is of type " + base::Utf8(GetTypeName()) +
                   " and takes no " + base::Utf8(typeNames[newValue.index()]));
        newValue = static_cast<float>(*integer);
    }
    CheckFinite(name, newValue);
    if (value == newValue)
        return;

    value = std::move(newValue);
    if (owner)
        owner->Fire(*this);
}
