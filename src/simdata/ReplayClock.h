#pragma once

#include <cstdint>

namespace host
{
class Clock;
}

/// The clock that replay follows: wall-clock ticks times a speed, in seconds of data time.
///
/// Tick differences are unsigned 32-bit, so a wrap of the counter costs nothing; a run may last 49.7 days.
class VtCReplayClock
{
public:
    explicit VtCReplayClock(const host::Clock& wallClock) : clock(wallClock) {}

    /// From `start` on, going back to `earliest` by whole spans beyond `latest`. A span of 0 stands at `earliest`.
    void StartLoopClock(double earliest, double latest, double start, double newSpeed);

    /// From `start` on without end, at the present speed.
    void StartOneWayClock(double start);

    /// Doesn't look at the wall clock: each tick stretches what `SetCurrentTime` told, measured from `start`, by
    /// `newSpeed`.
    void StartScaledClock(double start, double newSpeed);

    void TickClock();

    /// Stands at 0 again, under the mode and speed of before.
    void Reset();

    void SetCurrentTime(double time) { currentTime = time; }
    double GetCurrentTime() const { return currentTime; }
    double GetStartTime() const { return startTime; }

    /// Data seconds per wall-clock second.
    void SetSpeed(double newSpeed) { speed = newSpeed; }
    double GetSpeed() const { return speed; }

private:
    enum class Mode
    {
        none,
        loop = 1,
        oneWay = 2,
        scaled = 3,
    };

    double RunTime() const;

    const host::Clock& clock;
    std::uint32_t clockStartTicks = 0;
    double currentTime = 0.0;
    double startTime = 0.0;
    double latestTime = 0.0;
    double earliestTime = 0.0;
    double timeSpan = 0.0;
    double speed = 1.0;
    Mode clockMode = Mode::none;
};
