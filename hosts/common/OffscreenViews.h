#pragma once

#include <array>
#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include "host/ViewWindows.h"

namespace host
{
class Clock;
}

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
class OffscreenWindow : public host::ViewWindow
{
public:
    OffscreenWindow(int width, int height, host::WindowKind windowKind = host::WindowKind::pane)
        : kind(windowKind), rectangle{0, 0, width, height}
    {
    }

    host::WindowKind GetKind() const override { return kind; }
    host::Rectangle GetClientRectangle() const override { return rectangle; }

    /// A context keeps the size it was made with; a resized window needs a new one.
    void Resize(int width, int height) { rectangle = {0, 0, width, height}; }

private:
    host::WindowKind kind;
    host::Rectangle rectangle;
};

/// A pane that nobody sees. Its surface is as large as the whole frame, so that it can grow without a new context.
class OffscreenPane : public host::PaneWindow, public OffscreenSurface
{
public:
    host::Rectangle GetClientRectangle() const override { return {0, 0, rectangle.width, rectangle.height}; }
    host::Rectangle GetRectangleInParent() const override { return rectangle; }
    void SetRectangle(const host::Rectangle& newRectangle) override { rectangle = newRectangle; }
    host::Rectangle GetSurfaceRectangle() const override { return surface; }

    void SetSurface(const host::Rectangle& largest) { surface = largest; }

private:
    host::Rectangle rectangle;
    host::Rectangle surface;
};

class OffscreenSplitter : public host::SplitterWindow
{
public:
    OffscreenSplitter(int width, int height);

    host::Rectangle GetClientRectangle() const override { return client; }
    host::PaneWindow& GetPane(int row, int column) override
    {
        return panes[static_cast<std::size_t>(row * 2 + column)];
    }
    void Hide() override {}
    void ShowMaximised() override {}

private:
    host::Rectangle client;
    std::array<OffscreenPane, 4> panes;
};

/// Windows of scenes for programs without a screen. They have the size that is set when a scene's frame is made; the
/// program's loop lets the timers run.
class OffscreenViews : public host::ViewWindows
{
public:
    explicit OffscreenViews(const host::Clock& ticker) : clock(ticker) {}

    /// Of the frames that are made from now on, in pixels.
    void SetSize(int newWidth, int newHeight)
    {
        width = newWidth;
        height = newHeight;
    }

    /// Calls every timer whose period has passed, once.
    void RunTimers();

    std::unique_ptr<host::ChildFrameWindow> MakeChildFrame() override;

    /// A surface like any other: as large as the frames for a whole screen, as large as the tool says for its view.
    host::OpenedWindow OpenWindow(const host::WindowRequest& request) override;

    /// There is no selection to be shown.

private:
    class Frame;

    const host::Clock& clock;
    int width = 1280;
    int height = 720;
    std::vector<Frame*> frames; ///< the living ones, not owned
};

} // namespace hosts
