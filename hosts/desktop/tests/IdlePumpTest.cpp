#include "hosts/desktop/IdlePump.h"

#include <gtest/gtest.h>
#include <QCoreApplication>
#include <QElapsedTimer>

#include "hosts/common/IdleLoop.h"
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
    desktop::IdlePump pump{loop, clock};
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

TEST_F(Pump, LooksAgainSoonThoughAnEventWantsALongPause)
{
    work = [this] { clock.Sleep(5000); };
    pump.Start();
    Run(100);
    EXPECT_GE(count, 3) << "a change would be drawn too late";
    EXPECT_LE(count, 7) << "and the program sleeps between";
    const int before = count;
    pump.SetFlying(true);
    Run(40);
    EXPECT_GT(count, before + 4) << "no pauses while the user drives the camera";
}

TEST_F(Pump, LivesOnAfterAnEventThatFails)
{
    work = [] { throw std::runtime_error("lost"); };
    pump.Start();
    Run(60);
    EXPECT_GT(count, 2);
    ASSERT_EQ(messages.shown.size(), 1U);
    EXPECT_EQ(messages.shown[0].text, L"lost");
}

} // namespace
