#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

/// Numbers to text and back, the same under every locale: the point is the decimal separator.
namespace base
{

/// The number that is all of `text`, blanks around it and a leading "+" apart; nothing for anything else.
/// "nan" and "inf" are not numbers here.
std::optional<double> ParseDouble(std::string_view text);
std::optional<float> ParseFloat(std::string_view text);
std::optional<std::int64_t> ParseInteger(std::string_view text, int radix = 10);

/// The shortest text that reads back as the same value.
std::string FormatDouble(double value);
std::string FormatFloat(float value);

} // namespace base
