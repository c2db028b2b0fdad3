#include "base/Numbers.h"

#include <charconv>
#include <cmath>

#include "base/Text.h"

namespace base
{

namespace
{

template <class Number, class... Format>
std::optional<Number> Parse(std::string_view text, Format... format)
{
    text = Trim(text);
    if (!text.empty() && text.front() == '+')
    {
        text.remove_prefix(1);
        if (!text.empty() && text.front() == '-')
            return std::nullopt;
    }
    Number value{};
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), value, format...);
    if (error != std::errc() || end != text.data() + text.size() || text.empty())
        return std::nullopt;
    return value;
}

template <class Real>
std::optional<Real> ParseReal(std::string_view text)
{
    const std::optional<Real> value = Parse<Real>(text, std::chars_format::general);
    return value && std::isfinite(*value) ? value : std::nullopt;
}

template <class Real>
std::string Shortest(Real value)
{
    char buffer[64];
    const auto result = std::to_chars(buffer, buffer + sizeof(buffer), value);
    return std::string(buffer, result.ptr);
}

} // namespace

std::optional<double> ParseDouble(std::string_view text)
{
    return ParseReal<double>(text);
}

std::optional<float> ParseFloat(std::string_view text)
{
    return ParseReal<float>(text);
}

std::optional<std::int64_t> ParseInteger(std::string_view text, int radix)
{
    return Parse<std::int64_t>(text, radix);
}

std::string FormatDouble(double value)
{
    return Shortest(value);
}

std::string FormatFloat(float value)
{
    return Shortest(value);
}

} // namespace base
