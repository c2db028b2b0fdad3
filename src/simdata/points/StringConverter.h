#pragma once

#include <string>
#include <vector>

namespace SimulationDataPoints
{

/// Texts to numbers and to tokens, the same under every locale.
class VtCStringConverter
{
public:
    static const VtCStringConverter& getStringConverter();

    /// Non-zero if the whole text, blanks around it apart, is a number of the type; otherwise `out` stays as it is.
    /// `base` is 2 to 36; with 16 a leading "0x" is allowed.
    int convertCStringToNumber(const std::wstring& text, int& out, int base) const;
    int convertCStringToNumber(const std::wstring& text, float& out) const;
    int convertCStringToNumber(const std::wstring& text, double& out) const;

    /// Appends the parts of `text` between any of `separators` to `out`, leaving out empty ones; one new string each,
    /// that `freeStrings` frees. Returns how many.
    static long tokenizeAll(const std::wstring& text, std::vector<std::wstring*>& out, const std::wstring& separators);

    /// Frees the strings and empties the list.
    static void freeStrings(std::vector<std::wstring*>& strings);

private:
    VtCStringConverter() = default;
};

} // namespace SimulationDataPoints
