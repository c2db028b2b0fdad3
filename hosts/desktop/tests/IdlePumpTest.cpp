#include "hosts/desktop/IdlePump.h"

#include <gtest/gtest.h>
#include <QCoreApplication>
#include <QElapsedTimer>

#include "hosts/common/IdleLoop.h"
#include "hosts/desktop/PausedClock.h"
#include "tests/support/FakeHost.h"

namespace
{

/// The real clock and the toolkit's real loop, since it's their meeting that is tested; nothing waits for more than a
/// tenth of a second.
class Pump : public testing::Test, public host::IIdleProcessingEvents
{
protected:
    Pump() { loop.Advise(*this); }

    void OnIdle(std::int32_t& handled) override
    {
        handled = 1;
        ++count;
        deepest = std::max(deepest, ++depth);
        if (work)
            work();
        --depth;
    }

    static void Run(int milliseconds)
    {
        QElapsedTimer since;
        since.start();
        while (since.elapsed() < milliseconds)
            QCoreApplication::processEvents(QEventLoop::AllEvents, 5);
    }

    static inline int argumentCount = 1;
    static inline char programName[] = "desktop_tests";
    static inline char* arguments[] = {programName, nullptr};

    QCoreApplication application{argumentCount, arguments};
    fake::MessageService messages;
    desktop::PausedClock clock;
    hosts::IdleLoop loop{clock, messages};
    desktop::IdlePump pump{loop, clock, messages};
    std::function<void()> work;
    int count = 0;
    int depth = 0;
    int deepest = 0;
};

TEST_F(Pump, RaisesNoEventWithinAnother)
{
    work = [] { Run(10); };
    pump.Start();
    Run(60);
    EXPECT_GT(count, 1);
    EXPECT_EQ(deepest, 1);
}

TEST_F(Pump, KeepsThePaceOfTheScreen)
{
    pump.SetRefreshRate(100.0);
    pump.Start();
    Run(100);
    EXPECT_GE(count, 5);
    EXPECT_LE(count, 12);
}

TEST_F(Pump, LetsInputEndThePauseThatAnEventWants)
{
    work = [this] { clock.Sleep(5000); };
    pump.Start();
    QElapsedTimer since;
    since.start();
    Run(40);
    EXPECT_EQ(count, 1) << "the pause is kept";
    EXPECT_LT(since.elapsed(), 2000) << "but it doesn't hold the loop up";
    pump.Hurry();
    Run(20);
    EXPECT_EQ(count, 2);
    pump.SetFlying(true);
    Run(40);
    EXPECT_GT(count, 4) << "no pauses while the user drives the camera";
}

TEST_F(Pump, RestsUntilTheLastSuspensionEnds)
{
    pump.Start();
    pump.Suspend();
    pump.Suspend();
    Run(20);
    pump.Resume();
    Run(20);
    EXPECT_EQ(count, 0);
    pump.Resume();
    Run(20);
    EXPECT_GT(count, 0);
}

TEST_F(Pump, EndsAndTellsWhenTheHostFails)
{
    work = [] { throw host::InterfaceError(-7, "MainWindow"); };
    pump.Start();
    Run(30);
    EXPECT_EQ(count, 1);
    ASSERT_EQ(messages.shown.size(), 1U);
    EXPECT_EQ(messages.shown[0].second, L"-7");
}

} // namespace
