#include "hosts/common/OffscreenViews.h"

#include <algorithm>

#include "host/Clock.h"

namespace hosts
{

OffscreenSplitter::OffscreenSplitter(int width, int height) : client{0, 0, width, height}
{
    for (OffscreenPane& pane : panes)
        pane.SetSurface(client);
}

/// The window around one scene's panes, with its timers.
class OffscreenViews::Frame : public host::ChildFrameWindow
{
public:
    explicit Frame(OffscreenViews& owner) : views(owner), splitter(owner.width, owner.height)
    {
        views.frames.push_back(this);
    }
    ~Frame() override { std::erase(views.frames, this); }

    host::SplitterWindow& GetSplitter() override { return splitter; }

    void StartTimer(std::uint32_t id, std::uint32_t period, std::function<void()> tick) override
    {
        timers[id] = {period, views.clock.TickCount(), std::move(tick)};
    }
    void KillTimer(std::uint32_t id) override { timers.erase(id); }

    void RunTimers()
    {
        const std::uint32_t now = views.clock.TickCount();
        std::vector<std::uint32_t> due;
        for (const auto& [id, timer] : timers)
            if (now - timer.last >= timer.period)
                due.push_back(id);
        for (const std::uint32_t id : due)
        {
            const auto at = timers.find(id); // an earlier tick may have ended it
            if (at == timers.end())
                continue;
            at->second.last = now;
            const std::function<void()> tick = at->second.tick; // it may end itself
            tick();
        }
    }

private:
    struct Timer
    {
        std::uint32_t period = 0;
        std::uint32_t last = 0;
        std::function<void()> tick;
    };

    OffscreenViews& views;
    OffscreenSplitter splitter;
    std::map<std::uint32_t, Timer> timers;
};

void OffscreenViews::RunTimers()
{
    for (Frame* frame : std::vector<Frame*>(frames))
        frame->RunTimers();
}

std::unique_ptr<host::ChildFrameWindow> OffscreenViews::MakeChildFrame()
{
    return std::make_unique<Frame>(*this);
}

host::OpenedWindow OffscreenViews::OpenWindow(const host::WindowRequest& request)
{
    switch (request.kind)
    {
    case host::WindowKind::fullscreen:
        if (request.screen == 0)
            return {std::make_unique<OffscreenWindow>(width, height, request.kind), {}};
        return {nullptr, L"a program without a display has one screen, number 0"};
    case host::WindowKind::editorView:
        return {std::make_unique<OffscreenWindow>(request.width, request.height, request.kind), {}};
    default:
        return {nullptr, L"panes come with the window of their scene"};
    }
}

} // namespace hosts
