#pragma once

#include <cstdint>

#include <QTimer>

namespace host
{
class MessageService;
}
namespace hosts
{
class IdleLoop;
}

namespace desktop
{

class PausedClock;

/// Raises idle events from the toolkit's event loop whenever that has nothing else to do, at the pace of the screen.
///
/// No two lie within one another: while an event, or work with a progress display, is on, there are none.
class IdlePump
{
public:
    /// All of them outlive this.
    IdlePump(hosts::IdleLoop& idleLoop, PausedClock& pausedClock, host::MessageService& messageService);

    void Start();
    void Stop() { timer.stop(); }

    /// Frames a second that the screen shows; at most that many events come. 0 lets them follow at once.
    void SetRefreshRate(double rate);

    /// While the user drives the camera no pause is made.
    void SetFlying(bool flag);

    /// Ends the present pause: something has happened that may want a picture.
    void Hurry();

    /// No events until as many `Resume` have followed.
    void Suspend() { ++suspended; }
    void Resume();
    bool IsSuspended() const { return suspended > 0; }

private:
    void OnTimeout();
    void Arm(std::int64_t at);

    hosts::IdleLoop& loop;
    PausedClock& clock;
    host::MessageService& messages;
    QTimer timer;
    std::int64_t period = 0; ///< nanoseconds
    std::int64_t due = 0;    ///< counter of the clock, when the next event may come at the earliest
    bool pausing = false;
    bool flying = false;
    bool raising = false;
    bool failed = false;
    int suspended = 0;
};

} // namespace desktop
