#include "hosts/desktop/IdlePump.h"

#include <algorithm>

#include "hosts/common/IdleLoop.h"

namespace desktop
{

namespace
{

constexpr std::int64_t millisecond = 1000000;
constexpr std::uint32_t pauseWithoutSink = 10; // milliseconds
constexpr std::uint32_t longestPause = 20;     // a change is drawn by the event behind it

} // namespace

IdlePump::IdlePump(hosts::IdleLoop& idleLoop, PausedClock& pausedClock) : loop(idleLoop), clock(pausedClock)
{
    timer.setSingleShot(true);
    timer.setTimerType(Qt::PreciseTimer);
    QObject::connect(&timer, &QTimer::timeout, &timer, [this] { OnTimeout(); });
}

void IdlePump::Start()
{
    due = clock.Counter();
    timer.start(0);
}

void IdlePump::SetRefreshRate(double rate)
{
    period = rate > 0 ? static_cast<std::int64_t>(1e9 / rate) : 0;
}

void IdlePump::SetFlying(bool flag)
{
    flying = flag;
    Hurry();
}

void IdlePump::Hurry()
{
    if (!pausing || !timer.isActive())
        return;
    pausing = false;
    Arm(due);
}

void IdlePump::OnTimeout()
{
    if (raising)
        return;

    // Periods follow one another, so that the timer's whole milliseconds even out; what is late is not caught up.
    const std::int64_t now = clock.Counter();
    due = std::max(due, now - period) + period;

    raising = true;
    clock.BeginIdleEvent();
    const bool wanted = loop.Raise();
    std::uint32_t pause = std::min(clock.EndIdleEvent(), longestPause);
    raising = false;
    if (!wanted)
        pause = std::max(pause, pauseWithoutSink);
    if (flying)
        pause = 0;
    pausing = pause > 0;
    Arm(std::max(due, clock.Counter() + pause * millisecond));
}

void IdlePump::Arm(std::int64_t at)
{
    const std::int64_t left = at - clock.Counter();
    timer.start(static_cast<int>(std::max<std::int64_t>(0, (left + millisecond / 2) / millisecond)));
}

} // namespace desktop
