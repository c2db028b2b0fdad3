#pragma once

#include <array>
#include <functional>
#include <map>
#include <string>
#include <vector>

#include "host/ViewWindows.h"

/// Windows without a screen: rectangles that remember, and timers that a test lets fire.
namespace fake
{

class PaneWindow : public host::PaneWindow
{
public:
    host::Rectangle GetClientRectangle() const override { return {0, 0, rectangle.width, rectangle.height}; }
    host::Rectangle GetRectangleInParent() const override { return rectangle; }
    void SetRectangle(const host::Rectangle& newRectangle) override { rectangle = newRectangle; }

    host::Rectangle rectangle;
};

class SplitterWindow : public host::SplitterWindow
{
public:
    host::Rectangle GetClientRectangle() const override { return {0, 0, width, height}; }
    host::PaneWindow& GetPane(int row, int column) override
    {
        return panes[static_cast<std::size_t>(row * 2 + column)];
    }
    void Hide() override { shown = false; }
    void ShowMaximised() override { shown = true; }

    std::array<PaneWindow, 4> panes;
    int width = 804;
    int height = 604;
    bool shown = true;
};

class ChildFrameWindow : public host::ChildFrameWindow
{
public:
    explicit ChildFrameWindow(SplitterWindow& splitterWindow, std::map<std::uint32_t, std::uint32_t>& timerPeriods,
                              std::map<std::uint32_t, std::function<void()>>& timerTicks)
        : splitter(splitterWindow), periods(timerPeriods), ticks(timerTicks)
    {
    }

    host::SplitterWindow& GetSplitter() override { return splitter; }
    void StartTimer(std::uint32_t id, std::uint32_t period, std::function<void()> tick) override
    {
        periods[id] = period;
        ticks[id] = std::move(tick);
    }
    void KillTimer(std::uint32_t id) override
    {
        periods.erase(id);
        ticks.erase(id);
    }

private:
    SplitterWindow& splitter;
    std::map<std::uint32_t, std::uint32_t>& periods;
    std::map<std::uint32_t, std::function<void()>>& ticks;
};

class ViewWindows : public host::ViewWindows
{
public:
    std::unique_ptr<host::ChildFrameWindow> MakeChildFrame() override
    {
        return std::make_unique<ChildFrameWindow>(splitter, periods, ticks);
    }
    host::OpenedWindow OpenWindow(const host::WindowRequest&) override { return {nullptr, L"only a frame"}; }

    /// Lets every timer fire once; a tick may end its own timer.
    void Fire()
    {
        const auto due = ticks;
        for (const auto& [id, tick] : due)
            tick();
    }

    SplitterWindow splitter;
    std::map<std::uint32_t, std::uint32_t> periods;
    std::map<std::uint32_t, std::function<void()>> ticks;
};

} // namespace fake
