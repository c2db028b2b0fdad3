#pragma once

#include "hosts/common/SystemClock.h"

namespace desktop
{

/// The machine's clock, whose pauses within an idle event are made by the event loop instead.
///
/// The frame cycle sleeps when there is nothing to do. If that held up the thread, input would wait with it; as it is,
/// the loop waits that long before its next idle event, and ends the pause when input arrives.
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

} // namespace desktop
