#include "simdata/points/StringConverter.h"

#include <limits>
#include <string_view>

#include "base/Numbers.h"
#include "base/Text.h"

namespace SimulationDataPoints
{

const VtCStringConverter& VtCStringConverter::getStringConverter()
{
    static const VtCStringConverter converter;
    return converter;
}

int VtCStringConverter::convertCStringToNumber(const std::wstring& text, int& out, int base) const
{
    if (base < 2 || base > 36)
        return 0;
    const std::string utf8 = base::Utf8(text);
    std::string digits(base::Trim(utf8));
    const std::size_t sign = !digits.empty() && (digits[0] == '-' || digits[0] == '+') ? 1 : 0;
    if (base == 16 && (digits.compare(sign, 2, "0x") == 0 || digits.compare(sign, 2, "0X") == 0))
    {
        digits.erase(sign, 2);
        if (digits.size() > sign && (digits[sign] == '-' || digits[sign] == '+'))
            return 0;
    }
    const auto number = base::ParseInteger(digits, base);
    if (!number || *number < std::numeric_limits<int>::min() || *number > std::numeric_limits<int>::max())
        return 0;
    out = static_cast<int>(*number);
    return 1;
}

int VtCStringConverter::convertCStringToNumber(const std::wstring& text, float& out) const
{
    const auto number = base::ParseFloat(base::Utf8(text));
    if (!number)
        return 0;
    out = *number;
    return 1;
}

int VtCStringConverter::convertCStringToNumber(const std::wstring& text, double& out) const
{
    const auto number = base::ParseDouble(base::Utf8(text));
    if (!number)
        return 0;
    out = *number;
    return 1;
}

long VtCStringConverter::tokenizeAll(const std::wstring& text, std::vector<std::wstring*>& out,
                                     const std::wstring& separators)
{
    long tokens = 0;
    std::size_t start = text.find_first_not_of(separators);
    while (start != std::wstring::npos)
    {
        const std::size_t end = text.find_first_of(separators, start);
        out.push_back(new std::wstring(text, start, end == std::wstring::npos ? end : end - start));
        ++tokens;
        start = text.find_first_not_of(separators, end);
    }
    return tokens;
}

void VtCStringConverter::freeStrings(std::vector<std::wstring*>& strings)
{
    for (std::wstring* string : strings)
        delete string;
    strings.clear();
}

} // namespace SimulationDataPoints
