#pragma once

#include <array>
#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include "host/ViewWindows.h"
#include "hosts/common/OffscreenWindow.h"

namespace host
{
class Clock;
}

namespace hosts
{

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

    /// There is no selection to be shown.
    void SelectObject(const std::wstring&) override {}

private:
    class Frame;

    const host::Clock& clock;
    int width = 1280;
    int height = 720;
    std::vector<Frame*> frames; ///< the living ones, not owned
};

} // namespace hosts
