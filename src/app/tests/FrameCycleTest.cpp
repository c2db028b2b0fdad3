#include <gtest/gtest.h>

#include "app/FrameCycle.h"
#include "base/FrameSuspension.h"
#include "tests/support/FakeHost.h"

namespace
{

/// Everything that a pass works on, with its calls remembered in order.
struct FakeWork : VtIFrameWork
{
    bool HasController() const override { return controller; }
    bool IsOnline() const override { return online; }
    bool HasPlayState() const override { return playing; }
    std::int32_t Step() override
    {
        calls += "step ";
        return stepResult;
    }
    bool HasGraphicsSession() const override { return session; }
    bool IsSceneLoaded() const override { return scene; }
    void RenderCurrentView() override { calls += "observers "; }
    bool IsFrameDue() override { return due; }
    void RenderViewerFrame() override { calls += "viewer "; }
    double GetFrameRate() const override { return frameRate; }

    bool controller = true;
    bool online = false;
    bool playing = false;
    bool session = true;
    bool scene = true;
    bool due = true;
    std::int32_t stepResult = 1;
    double frameRate = 0.0;
    std::string calls;
};

struct FrameCycle : testing::Test
{
    FrameCycle()
    {
        cycle.SetMainWindow(&host.mainWindow);
        cycle.SetVariables(&host.variables);
    }

    std::string Pass()
    {
        work.calls.clear();
        host.clock.sleeps.clear();
        EXPECT_EQ(cycle.IdleStep(), 1);
        return work.calls;
    }

    void Passes(int count)
    {
        for (int i = 0; i < count; ++i)
            Pass();
    }

    fake::Host host;
    FakeWork work;
    VtCFrameCycle cycle{host.clock, work};
};

enum Window
{
    none,
    normal,
    minimised
};

struct PassCase
{
    const char* name;
    Window window;
    bool controller, online, playing, session, scene;
    const char* calls;
    bool sleeps;
};

const PassCase passes[] = {
    {"online steps and draws", normal, true, true, false, true, true, "step observers viewer ", false},
    {"a replay steps and draws", normal, true, false, true, true, true, "step observers viewer ", false},
    {"nothing to do sleeps and still draws", normal, true, false, false, true, true, "observers viewer ", true},
    {"a minimised window stops everything", minimised, true, true, true, true, true, "", true},
    {"no window: nothing, and no sleep", none, true, true, true, true, true, "", false},
    {"no controller still draws", normal, false, false, false, true, true, "observers viewer ", false},
    {"minimised without controller", minimised, false, false, false, true, true, "", true},
    {"no scene: data go on", normal, true, true, false, true, false, "step ", false},
    {"no graphics session: data go on", normal, true, true, false, false, true, "step ", false},
};

TEST_F(FrameCycle, EachStateOfTheHostGetsItsOwnPass)
{
    for (const PassCase& pass : passes)
    {
        SCOPED_TRACE(pass.name);
        cycle.SetMainWindow(pass.window == none ? nullptr : &host.mainWindow);
        host.mainWindow.state = pass.window == minimised ? host::windowMinimised : host::windowNormal;
        work.controller = pass.controller;
        work.online = pass.online;
        work.playing = pass.playing;
        work.session = pass.session;
        work.scene = pass.scene;
        EXPECT_EQ(Pass(), pass.calls);
        EXPECT_EQ(host.clock.sleeps, pass.sleeps ? std::vector<std::uint32_t>{50} : std::vector<std::uint32_t>{});
    }
}

TEST_F(FrameCycle, FailedStepsWaitMoreThanFiveSecondsButPicturesGoOn)
{
    work.online = true;
    Pass(); // takes the start of the retry interval
    const std::int64_t start = cycle.GetRetryStart();
    host.clock.Advance(100.0);
    EXPECT_EQ(Pass(), "step observers viewer ");
    EXPECT_EQ(cycle.GetRetryStart(), start) << "a good step doesn't move the interval";

    work.stepResult = 0;
    EXPECT_EQ(Pass(), "step observers viewer ") << "the step that fails";
    EXPECT_EQ(cycle.GetDataStepArmed(), 0);
    EXPECT_EQ(Pass(), "step observers viewer ") << "after a long good run the first retry comes at once";
    const std::int64_t retried = cycle.GetRetryStart();
    EXPECT_GT(retried, start);
    EXPECT_EQ(Pass(), "observers viewer ");

    host.clock.Advance(4.9);
    EXPECT_EQ(Pass(), "observers viewer ");
    host.clock.Advance(0.1);
    EXPECT_EQ(Pass(), "observers viewer ") << "exactly 5.0 s is not enough";
    EXPECT_EQ(cycle.GetRetryStart(), retried);
    host.clock.Advance(0.001);
    work.stepResult = 1;
    EXPECT_EQ(Pass(), "step observers viewer ");
    EXPECT_EQ(cycle.GetDataStepArmed(), 1);
    EXPECT_EQ(cycle.GetRetryStart() - retried, 5001000) << "the retry moves the interval, in microseconds of the clock";
    EXPECT_EQ(Pass(), "step observers viewer ");
}

TEST_F(FrameCycle, StoppingAfterAFailureArmsTheNextStep)
{
    work.online = true;
    work.stepResult = 0;
    Passes(2);
    ASSERT_EQ(cycle.GetDataStepArmed(), 0);
    work.online = false;
    Pass();
    EXPECT_EQ(cycle.GetDataStepArmed(), 1);
    work.playing = true;
    EXPECT_EQ(Pass(), "step observers viewer ") << "no retry wait for the replay that follows";
}

TEST_F(FrameCycle, AWindowThatFailsLeavesThePassAndChangesNothing)
{
    work.online = true;
    Pass();
    const auto before = std::tuple(cycle.GetDataStepArmed(), cycle.GetRetryStart(), cycle.GetFrameCounter());
    host.mainWindow.fails = true;
    work.calls.clear();
    EXPECT_THROW(cycle.IdleStep(), host::InterfaceError);
    EXPECT_EQ(work.calls, "");
    EXPECT_EQ(std::tuple(cycle.GetDataStepArmed(), cycle.GetRetryStart(), cycle.GetFrameCounter()), before);
}

struct RateCase
{
    double rate;
    const wchar_t* text;
};

// Each rate is looked at once; the text is what stands in the variable behind it.
const RateCase rates[] = {
    {0.0, L""},         // no statistic yet
    {0.1, L""},         // 0.1 as a float is the hysteresis itself: not more
    {9.5, L"09.5"},     // four characters at least
    {59.95, L"60.0"},   // 59.95 as a float lies a little above the half
    {60.04, L"60.0"},   // differs by 0.09
    {59.9, L"60.0"},    // by 0.05 from what was published last
    {59.8, L"59.8"},    //
    {60.1, L"60.1"},    //
    {123.45, L"123.4"}, // 123.45 as a float lies a little below the half
};

TEST_F(FrameCycle, TheFrameRateIsPublishedEveryTenthPassWhenItHasChanged)
{
    int pass = 0;
    for (const RateCase& rate : rates)
    {
        SCOPED_TRACE(rate.rate);
        const std::wstring before = host.variables.texts[L"fps"];
        work.frameRate = rate.rate;
        Passes(9);
        EXPECT_EQ(host.variables.texts[L"fps"], before) << "not before the tenth pass";
        Pass();
        EXPECT_EQ(host.variables.texts[L"fps"], rate.text);
        EXPECT_EQ(cycle.GetFrameCounter(), pass += 10);
    }
}

TEST_F(FrameCycle, WithoutASceneTheRateIsEmptyInEveryPassAndTheCounterStands)
{
    work.frameRate = 30.0;
    Passes(10);
    ASSERT_EQ(host.variables.texts[L"fps"], L"30.0");
    for (bool* missing : {&work.scene, &work.session})
    {
        *missing = false;
        const int writes = host.variables.writes;
        Passes(3);
        EXPECT_EQ(host.variables.texts[L"fps"], L"");
        EXPECT_EQ(host.variables.writes, writes + 3);
        EXPECT_EQ(cycle.GetFrameCounter(), 10);
        *missing = true;
    }
    host.mainWindow.state = host::windowMinimised;
    Pass();
    EXPECT_EQ(cycle.GetFrameCounter(), 11) << "a minimised window doesn't stop the display";
}

TEST_F(FrameCycle, ItLivesBetweenConnectAndDisconnect)
{
    work.online = true;
    EXPECT_EQ(host.variables.idle.Raise(), 0);
    EXPECT_EQ(work.calls, "");

    cycle.ConnectIdleSink();
    cycle.ConnectIdleSink(); // a second one is not connected
    EXPECT_EQ(host.variables.idle.sinks.size(), 1U);
    EXPECT_EQ(host.variables.idle.Raise(), 1);
    EXPECT_EQ(work.calls, "step observers viewer ");

    host.mainWindow.state = host::windowMinimised;
    EXPECT_EQ(host.variables.idle.Raise(), 1) << "the next event is wanted also when nothing was done";

    cycle.DisconnectIdleSink();
    cycle.DisconnectIdleSink();
    EXPECT_FALSE(cycle.IsIdleSinkConnected());
    EXPECT_TRUE(host.variables.idle.sinks.empty());

    cycle.ConnectIdleSink();
    EXPECT_EQ(host.variables.idle.sinks.size(), 1U) << "a suspended cycle can be taken up again";
}

TEST_F(FrameCycle, WithoutIdleEventsItStaysAsleep)
{
    host.variables.hasIdle = false;
    cycle.ConnectIdleSink();
    EXPECT_FALSE(cycle.IsIdleSinkConnected());
    cycle.SetVariables(nullptr);
    cycle.ConnectIdleSink();
    EXPECT_FALSE(cycle.IsIdleSinkConnected());
    EXPECT_EQ(Pass(), "observers viewer ");
}

TEST_F(FrameCycle, AnOperationMaySuspendItFromWithinItsOwnEvent)
{
    struct SuspendingWork : FakeWork
    {
        std::int32_t Step() override
        {
            suspended->DisconnectIdleSink();
            return FakeWork::Step();
        }
        VtCFrameCycle* suspended = nullptr;
    } suspending;
    suspending.online = true;
    VtCFrameCycle own{host.clock, suspending};
    suspending.suspended = &own;
    own.SetMainWindow(&host.mainWindow);
    own.SetVariables(&host.variables);
    own.ConnectIdleSink();
    EXPECT_EQ(host.variables.idle.Raise(), 1);
    EXPECT_EQ(suspending.calls, "step observers viewer ") << "the pass that is on its way ends as any other";
    EXPECT_EQ(host.variables.idle.Raise(), 0);
}

TEST_F(FrameCycle, APictureThatWouldNotChangeIsDrawnOnlyWhenItIsAskedFor)
{
    work.due = false;
    EXPECT_EQ(Pass(), "observers ");
    cycle.RedrawNow();
    EXPECT_EQ(work.calls, "observers observers viewer ");
    const VtCFrameSuspension undrawn(VtCFrameSuspension::Extent::pictures);
    work.calls.clear();
    cycle.RedrawNow();
    EXPECT_EQ(work.calls, "");
}

TEST_F(FrameCycle, NoInnerSuspensionEndsAnOuterOne)
{
    cycle.ConnectIdleSink();
    const auto lives = [this] { return host.variables.idle.Raise() == 1; };
    {
        const VtCFrameSuspension outer;
        {
            const VtCFrameSuspension inner(VtCFrameSuspension::Extent::steps);
            EXPECT_FALSE(lives());
        }
        EXPECT_FALSE(lives());
        cycle.DisconnectIdleSink();
        cycle.ConnectIdleSink();
        EXPECT_FALSE(lives());
        const VtCFrameSuspension undrawn(VtCFrameSuspension::Extent::pictures);
        EXPECT_EQ(work.calls, "") << "no step, no picture";
    }
    EXPECT_TRUE(lives());
    const VtCFrameSuspension undrawn(VtCFrameSuspension::Extent::pictures);
    EXPECT_TRUE(lives()) << "data go on without pictures";
}

} // namespace
