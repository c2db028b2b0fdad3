#include "hosts/desktop/SceneWindows.h"

#include <map>

#include <QTimer>

#include "hosts/desktop/ViewArea.h"

namespace desktop
{

/// The window around one scene's panes, with its timers.
class SceneWindows::Frame : public host::ChildFrameWindow
{
public:
    explicit Frame(SceneWindows& owner) : windows(owner), area(new ViewArea(owner.surroundings))
    {
        windows.area = area;
        windows.place(area);
    }
    ~Frame() override
    {
        timers.clear();
        windows.place(nullptr);
        delete area.data();
    }

    host::SplitterWindow& GetSplitter() override { return *area; }

    void StartTimer(std::uint32_t id, std::uint32_t period, std::function<void()> tick) override
    {
        std::unique_ptr<QTimer>& timer = timers[id];
        if (timer)
            timer.release()->deleteLater(); // it may be the one that is ticking
        timer = std::make_unique<QTimer>();
        QObject::connect(timer.get(), &QTimer::timeout, timer.get(), std::move(tick));
        timer->start(static_cast<int>(period));
    }

    void KillTimer(std::uint32_t id) override
    {
        const auto at = timers.find(id);
        if (at == timers.end())
            return;
        at->second->stop();
        at->second.release()->deleteLater();
        timers.erase(at);
    }

private:
    SceneWindows& windows;
    QPointer<ViewArea> area;
    std::map<std::uint32_t, std::unique_ptr<QTimer>> timers;
};

SceneWindows::SceneWindows(ViewSurroundings& programAround, std::function<void(ViewArea*)> placeArea)
    : surroundings(programAround), place(std::move(placeArea))
{
}

ViewArea* SceneWindows::GetArea() const
{
    return area;
}

std::unique_ptr<host::ChildFrameWindow> SceneWindows::MakeChildFrame()
{
    return std::make_unique<Frame>(*this);
}

host::OpenedWindow SceneWindows::OpenWindow(const host::WindowRequest&)
{
    return {nullptr, L"this program shows a scene in the panes of its window only"};
}

} // namespace desktop
