#include "scene/RenderMode.h"

#include "base/Text.h"

namespace
{

// In the order of the values.
constexpr std::wstring_view names[] = {L"Gouraud", L"Textured", L"Flat", L"WireFrame", L"Transparent", L"Mixed"};
constexpr std::int32_t mixed = static_cast<std::int32_t>(VtERenderMode::Mixed);

} // namespace

VtERenderMode RenderModeFromText(std::wstring_view text)
{
    for (std::int32_t value = 0; value < mixed; ++value)
        if (base::EqualsNoCase(names[value], text))
            return static_cast<VtERenderMode>(value);
    return VtERenderMode::Mixed;
}

std::wstring RenderModeToText(VtERenderMode mode)
{
    const std::int32_t value = static_cast<std::int32_t>(mode);
    return std::wstring(names[value >= 0 && value < mixed ? value : mixed]);
}
