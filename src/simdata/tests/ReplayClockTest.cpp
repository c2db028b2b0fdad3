#include "simdata/ReplayClock.h"

#include <gtest/gtest.h>

#include "tests/support/FakeHost.h"

namespace
{

constexpr std::uint32_t beforeWrap = 0xFFFFFFF0; // 16 ms before the tick counter starts over

struct ClockRun
{
    const char* name;
    std::uint32_t startTicks;
    double start, speed, elapsed, expected;
};

TEST(ReplayClock, LoopsInsideItsSpanAtAnySpeedAndOverATickWrap)
{
    // The span is 10 to 20.
    const ClockRun runs[] = {
        {"forwards in real time", 1000, 12.0, 1.0, 3.5, 15.5},
        {"the end itself is inside", 1000, 12.0, 1.0, 8.0, 20.0},
        {"once around", 1000, 15.0, 1.0, 12.5, 17.5},
        {"three times around", 1000, 15.0, 1.0, 31.0, 16.0},
        {"1/32 over the wrap", beforeWrap, 12.0, 0.03125, 64.0, 14.0},
        {"32 over the wrap", beforeWrap, 12.0, 32.0, 2.0, 16.0}, // 76 is 56 beyond 20: five spans and 6
        {"a day and a half over the wrap", beforeWrap, 10.0, 1.0, 129603.0, 13.0},
        // Signed milliseconds would be negative here, without the counter having wrapped.
        {"30 days", 0, 10.0, 1.0, 2592004.0, 14.0},
    };
    for (const ClockRun& run : runs)
    {
        SCOPED_TRACE(run.name);
        fake::Clock wall;
        wall.startTicks = run.startTicks;
        VtCReplayClock clock(wall);
        clock.StartLoopClock(10.0, 20.0, run.start, run.speed);
        wall.Advance(run.elapsed);
        clock.TickClock();
        EXPECT_NEAR(clock.GetCurrentTime(), run.expected, 1e-9);
    }
}

TEST(ReplayClock, RunsOneWayBeyondAnyEnd)
{
    for (const double speed : {0.03125, 1.0, 32.0})
    {
        SCOPED_TRACE(speed);
        fake::Clock wall;
        wall.startTicks = beforeWrap;
        VtCReplayClock clock(wall);
        clock.SetSpeed(speed);
        clock.StartOneWayClock(4.0);
        wall.Advance(64.0);
        clock.TickClock();
        EXPECT_DOUBLE_EQ(clock.GetCurrentTime(), 4.0 + 64.0 * speed);
    }
}

TEST(ReplayClock, KeepsToWhatItCanTell)
{
    fake::Clock wall;
    VtCReplayClock clock(wall);
    const auto now = [&]
    {
        wall.Advance(2.0);
        clock.TickClock();
        return clock.GetCurrentTime();
    };
    clock.SetCurrentTime(7.0);
    EXPECT_EQ(now(), 7.0) << "not started";
    clock.StartLoopClock(5.0, 5.0, 5.0, 1.0);
    EXPECT_EQ(now(), 5.0) << "a file of one frame";
    clock.StartLoopClock(10.0, 20.0, 10.0, 1e300);
    EXPECT_TRUE(now() >= 10.0 && clock.GetCurrentTime() <= 20.0) << "beyond any integer";
    clock.StartScaledClock(2.0, 0.5);
    clock.SetCurrentTime(6.0);
    EXPECT_DOUBLE_EQ(now(), 4.0) << "what a recorder tells, whatever the wall clock says";
}

} // namespace
