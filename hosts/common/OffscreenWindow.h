#pragma once

#include "host/Graphics.h"

namespace hosts
{

/// A window whose surface is larger than what is drawn to at present.
class OffscreenSurface
{
public:
    virtual ~OffscreenSurface() = default;
    virtual host::Rectangle GetSurfaceRectangle() const = 0;
};

/// A window that nobody sees: just a size. What is drawn to it is read back from its context.
class OffscreenWindow : public host::Window
{
public:
    OffscreenWindow() = default;
    OffscreenWindow(int width, int height) : rectangle{0, 0, width, height} {}

    host::Rectangle GetClientRectangle() const override { return rectangle; }

    /// A context keeps the size it was made with; a resized window needs a new one.
    void Resize(int width, int height) { rectangle = {0, 0, width, height}; }

private:
    host::Rectangle rectangle;
};

} // namespace hosts
