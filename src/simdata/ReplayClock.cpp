#include "simdata/ReplayClock.h"

#include <cmath>

#include "host/Clock.h"

void VtCReplayClock::StartLoopClock(double earliest, double latest, double start, double newSpeed)
{
    earliestTime = earliest;
    latestTime = latest;
    startTime = start;
    timeSpan = latest - earliest;
    speed = newSpeed;
    clockMode = Mode::loop;
    clockStartTicks = clock.TickCount();
}

void VtCReplayClock::StartOneWayClock(double start)
{
    startTime = start;
    clockMode = Mode::oneWay;
    clockStartTicks = clock.TickCount();
}

void VtCReplayClock::StartScaledClock(double start, double newSpeed)
{
    startTime = start;
    speed = newSpeed;
    clockMode = Mode::scaled;
}

void VtCReplayClock::TickClock()
{
    switch (clockMode)
    {
    case Mode::loop:
        currentTime = RunTime();
        // The remainder takes whole spans off without the detour over an integer, which huge times would overflow.
        if (currentTime > latestTime)
            currentTime = timeSpan > 0.0 ? earliestTime + std::fmod(currentTime - latestTime, timeSpan) : earliestTime;
        break;
    case Mode::oneWay:
        currentTime = RunTime();
        break;
    case Mode::scaled:
        currentTime = (currentTime - startTime) * speed + startTime;
        break;
    case Mode::none:
        break;
    }
}

void VtCReplayClock::Reset()
{
    currentTime = 0.0;
    startTime = 0.0;
    clockStartTicks = 0;
}

double VtCReplayClock::RunTime() const
{
    const std::uint32_t elapsed = clock.TickCount() - clockStartTicks;
    return elapsed / 1000.0 * speed + startTime;
}
