#pragma once

#include <cstdint>

#include <QTimer>

#include "hosts/common/System.h"

namespace hosts
{
class IdleLoop;
}

namespace desktop
{

/// The machine's clock, whose pauses within an idle event are made by the event loop instead.
///
/// The frame cycle sleeps when there is nothing to do. If that held up the thread, input would wait with it; as it is,
/// the loop waits before its next idle event, and ends the pause when input arrives.
class PausedClock : public hosts::SystemClock
{
public:
    void Sleep(std::uint32_t milliseconds) override
    {
        if (collecting)
            pause += milliseconds;
        else
            SystemClock::Sleep(milliseconds);
    }

    void BeginIdleEvent()
    {
        collecting = true;
        pause = 0;
    }

    /// The pause that the idle event wanted, in milliseconds.
    std::uint32_t EndIdleEvent()
    {
        collecting = false;
        return pause;
    }

private:
    bool collecting = false;
    std::uint32_t pause = 0;
};

/// Raises idle events from the toolkit's event loop whenever that has nothing else to do, at the pace of the screen.
///
/// In a pause the loop waits for events of the toolkit, so the program sleeps; it looks again soon enough for whatever
/// has changed by then to be drawn within 50 ms. No two events lie within one another.
class IdlePump
{
public:
    /// Both outlive this.
    IdlePump(hosts::IdleLoop& idleLoop, PausedClock& pausedClock);

    void Start();
    void Stop() { timer.stop(); }

    /// Frames a second that the screen shows; at most that many events come. 0 lets them follow at once.
    void SetRefreshRate(double rate);

    /// While the user drives the camera no pause is made.
    void SetFlying(bool flag);

    /// Ends the present pause: something has happened that may want a picture.
    void Hurry();

private:
    void OnTimeout();
    void Arm(std::int64_t at);

    hosts::IdleLoop& loop;
    PausedClock& clock;
    QTimer timer;
    std::int64_t period = 0; ///< nanoseconds
    std::int64_t due = 0;    ///< counter of the clock, when the next event may come at the earliest
    bool pausing = false;
    bool flying = false;
    bool raising = false;
};

} // namespace desktop
