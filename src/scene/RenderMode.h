#pragma once

#include <cstdint>
#include <string>
#include <string_view>

/// How bodies are drawn. `Mixed` is a value of the whole scene only: each body then uses its own.
enum class VtERenderMode : std::int32_t
{
    Gouraud = 0,
    Textured = 1,
    Flat = 2,
    WireFrame = 3,
    Transparent = 4,
    Mixed = 5,
};

/// Without regard to case; an empty and an unknown text give `Mixed`.
VtERenderMode RenderModeFromText(std::wstring_view text);

/// "Mixed" for everything that isn't a body's mode.
std::wstring RenderModeToText(VtERenderMode mode);
