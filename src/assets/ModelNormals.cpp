#include "assets/ModelNormals.h"

#include <charconv>

#include "base/Text.h"

std::optional<float> GetRecalculationAngle(std::string_view description)
{
    constexpr std::string_view attribute = "<vtattr:Attribute name=\"recalc_normals\">";
    constexpr std::string_view valueBegin = "<vtattr:value>";
    constexpr std::string_view valueEnd = "</vtattr:value>";

    const std::size_t at = description.find(attribute);
    const std::size_t begin = at == std::string_view::npos ? at : description.find(valueBegin, at);
    const std::size_t end = begin == std::string_view::npos ? begin : description.find(valueEnd, begin);
    if (end == std::string_view::npos)
        return std::nullopt;

    // As much of a number as there is, 0 without one, under every locale.
    const std::string_view text =
        base::Trim(description.substr(begin + valueBegin.size(), end - begin - valueBegin.size()));
    double degrees = 0;
    std::from_chars(text.data(), text.data() + text.size(), degrees);
    return static_cast<float>(degrees) * 3.1415927f / 180.0f;
}
