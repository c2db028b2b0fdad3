#include "hosts/desktop/IdlePump.h"

#include <algorithm>
#include <string>

#include "base/Text.h"
#include "host/InterfaceError.h"
#include "host/Messages.h"
#include "hosts/common/HostMessages.h"
#include "hosts/common/IdleLoop.h"
#include "hosts/desktop/PausedClock.h"

namespace desktop
{

namespace
{

constexpr std::int64_t millisecond = 1000000;
constexpr std::uint32_t pauseWithoutSink = 10;

} // namespace

IdlePump::IdlePump(hosts::IdleLoop& idleLoop, PausedClock& pausedClock, host::MessageService& messageService)
    : loop(idleLoop), clock(pausedClock), messages(messageService)
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

void IdlePump::Resume()
{
    if (--suspended == 0 && !raising && !failed)
        Arm(due);
}

void IdlePump::OnTimeout()
{
    if (raising || suspended > 0 || failed)
        return;

    // Periods follow one another, so that the timer's whole milliseconds even out; what is late is not caught up.
    const std::int64_t now = clock.Counter();
    due = std::max(due, now - period) + period;

    raising = true;
    clock.BeginIdleEvent();
    bool wanted = false;
    try
    {
        wanted = loop.Raise();
    }
    catch (const host::InterfaceError& error)
    {
        // It would fail again with the next event.
        failed = true;
        messages.Show({.number = hosts::messageInterfaceFailed,
                       .first = base::Wide(error.InterfaceId()),
                       .second = std::to_wstring(error.ResultCode()),
                       .severity = host::Severity::error});
    }
    std::uint32_t pause = clock.EndIdleEvent();
    raising = false;
    if (failed)
        return;
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
