#include <cmath>
#include <functional>

#include "simdata/tests/SimulationFixture.h"

using namespace simtest;

namespace
{

class Router : public SimulationTest
{
protected:
    Router() : listener(log) { router.AddChangeObject(&listener); }
    ~Router() override { router.RemoveChangeObject(&listener); }

    void Select()
    {
        router.SelectPoint(L"Live");
        log.clear();
    }

    Listener listener;
};

TEST_F(Router, SaysThatNoDataPointLoaded)
{
    EXPECT_TRUE(messages.Has(host::Severity::error, 303));
    EXPECT_TRUE(router.GetPluginFaults().empty());
}

TEST_F(Router, TellsANewListenerOfThePoints)
{
    EXPECT_EQ(log, Log{"points"});
    router.AddChangeObject(&listener);
    EXPECT_EQ(log.size(), 1U) << "registered twice";
}

TEST_F(Router, NamesSourcesAndSinks)
{
    Point& sink = Add(L"Recorder");
    sink.source = false;
    sink.sink = true;
    using Names = std::vector<std::wstring>;
    EXPECT_EQ(router.GetPointNames(VtCSimulationDataRouter::sources), (Names{L"Live"}));
    EXPECT_EQ(router.GetPointNames(VtCSimulationDataRouter::sinks), (Names{L"Recorder"}));
    EXPECT_EQ(router.GetPointNames(VtCSimulationDataRouter::sources | VtCSimulationDataRouter::sinks),
              (Names{L"Live", L"Recorder"}));
    EXPECT_EQ(router.GetPointNames(VtCSimulationDataRouter::scene), Names{}) << "without a document";
}

TEST_F(Router, FindsPointsWithoutRegardToCaseTheLastOneFirst)
{
    Point& second = Add(L"LIVE");
    EXPECT_EQ(router.FindPoint(L"lIvE"), &second);
    EXPECT_EQ(router.FindPoint(L""), nullptr);
    EXPECT_EQ(router.FindPoint(L"Liv"), nullptr);
}

TEST_F(Router, SelectsASourceOnce)
{
    log.clear();
    router.SelectPoint(L"Live");
    EXPECT_EQ(Taken(), (Log{"selected Live|TEST|bench"}));
    EXPECT_EQ(variables.texts[L"simulationDatapointInfo"], L"SimulationDataPoint-Live");

    router.SelectPoint(L"Live");
    router.SelectPoint(L"LIVE");
    EXPECT_EQ(Taken(), Log{}) << "the active one again";

    Add(L"Recorder").source = false;
    router.SelectPoint(L"Recorder");
    router.SelectPoint(L"unknown");
    EXPECT_EQ(router.GetActivePointName(0), L"Live");

    Add(L"Other");
    router.SelectPoint(L"other");
    EXPECT_EQ(router.GetActivePointName(0), L"Other");
    EXPECT_EQ(router.GetActivePoint(1), nullptr) << "replaced, not added";
}

TEST_F(Router, PreloadsAPointThatIsEmptyAndMayStream)
{
    struct Case
    {
        const char* name;
        bool preloads;
        int streamMode;
        bool full;
        bool fetched;
    };
    const Case cases[] = {
        {"empty", true, 1, false, true},
        {"can't", false, 1, false, false},
        {"a look at the header", true, 0, false, false},
        {"has frames", true, 1, true, false},
    };
    for (const Case& c : cases)
    {
        SCOPED_TRACE(c.name);
        Point& point = Add(L"Preloader");
        point.SetChannels({L"Body"});
        point.preloads = c.preloads;
        point.SetInitialStreamMode(c.streamMode);
        if (c.full)
            point.Fill({0.0});
        log.clear();
        router.SelectPoint(L"Preloader");
        EXPECT_EQ(Taken(), (c.fetched ? Log{"fetch Preloader", "selected Preloader|TEST|bench"}
                                      : Log{"selected Preloader|TEST|bench"}));
        router.Clear();
    }
}

TEST_F(Router, DeselectsAndClearsWithTheStatusLine)
{
    Select();
    router.DeselectPoint(L"unknown");
    EXPECT_EQ(router.GetActivePointName(0), L"Live");
    router.DeselectPoint(L"live");
    EXPECT_EQ(Taken(), (Log{"disconnect Live", "cleared "}));
    EXPECT_EQ(router.GetActivePoint(0), nullptr);
    EXPECT_EQ(router.GetCurrentChannels(), nullptr);
    EXPECT_EQ(variables.texts[L"simulationDatapointInfo"], L"No SimulationDataPoint");

    Select();
    router.SetCurrentTime(3.0);
    router.Clear();
    EXPECT_EQ(Taken(), (Log{"disconnect Live", "cleared "}));
    EXPECT_EQ(router.GetCurrentTime(), 0.0);
    EXPECT_EQ(variables.texts[L"simulationDatapointInfo"], L"No SimulationDataPoint");
}

TEST_F(Router, KeepsTheChannelListUntilTheConfigurationChanges)
{
    Select();
    using Names = std::vector<std::wstring>;
    ASSERT_NE(router.GetCurrentChannels(), nullptr);
    EXPECT_EQ(*router.GetCurrentChannels(), (Names{L"Body", L"Wheel"}));
    const int asked = live.channelQuestions;
    router.GetCurrentChannels();
    router.GotoFirst();
    EXPECT_EQ(live.channelQuestions, asked);

    // A listener that shows the channels asks for them while it is told.
    class ChannelList : public Listener
    {
    public:
        ChannelList(Log& shared, VtCSimulationDataRouter& owner) : Listener(shared), router(owner) {}
        void OnDataPointSelected(const std::wstring&) override { shown = *router.GetCurrentChannels(); }
        VtCSimulationDataRouter& router;
        Names shown;
    };
    ChannelList list(log, router);
    router.AddChangeObject(&list);
    live.SetChannels({L"Trailer"});
    router.NotifyConfiguration(router.GetConfigurationText(L"Live", 0));
    EXPECT_EQ(*router.GetCurrentChannels(), (Names{L"Trailer"}));
    EXPECT_EQ(list.shown, (Names{L"Trailer"}));
    router.RemoveChangeObject(&list);
}

TEST_F(Router, AddressesInstrumentsByNameOnceThereAreNames)
{
    Instruments instruments;
    scene.instruments = &instruments;
    Point& poses = Add(L"Poses");
    poses.SetChannels({L"Body"});
    router.SelectPoint(L"Poses");
    EXPECT_EQ(instruments.mode, VtEInstrumentDataMode::LegacyStreams);
    router.SelectPoint(L"Live");
    EXPECT_EQ(instruments.mode, VtEInstrumentDataMode::SignalNames);
}

TEST_F(Router, KnowsWhetherAPointIsConfigured)
{
    EXPECT_TRUE(router.IsConfigured(L"Live"));
    EXPECT_FALSE(router.IsConfigured(L"")) << "none is active";
    live.path.clear();
    EXPECT_FALSE(router.IsConfigured(L"Live"));
    live.path = L"x";
    live.type.clear();
    EXPECT_FALSE(router.IsConfigured(L"Live"));
}

// The frames of "Live" are at 1.00, 1.01, 1.02 and 1.04 s.
TEST_F(Router, ReachesEachFrameOnItsOwnWay)
{
    Select();
    struct Way
    {
        const char* name;
        std::function<bool(VtCSimulationDataRouter&)> go;
        Log told;
        bool reached;
        double clock; ///< NaN: stays
    };
    constexpr double stays = NAN;
    const Way ways[] = {
        {"first", [](auto& r) { return r.GotoFirst(); }, {"frame 1 1"}, true, 1.0},
        {"last", [](auto& r) { return r.GotoLast(); }, {"frame 4 1.04"}, true, 1.04},
        {"next at the end", [](auto& r) { return r.GotoNext(); }, {}, false, stays},
        {"previous", [](auto& r) { return r.GotoPrevious(); }, {"frame 3 1.02"}, true, stays},
        {"step back", [](auto& r) { return r.StepBack(); }, {"frame 2"}, true, stays},
        {"next", [](auto& r) { return r.GotoNext(); }, {"frame 3 1.02"}, true, stays},
        {"frame 0", [](auto& r) { return r.GotoFrame({}, 0); }, {"frame 1 1"}, true, stays},
        {"frame -3", [](auto& r) { return r.GotoFrame({}, -3); }, {"frame 1 1"}, true, stays},
        {"previous at the start", [](auto& r) { return r.GotoPrevious(); }, {}, false, stays},
        {"step back at the start", [](auto& r) { return r.StepBack(); }, {}, false, stays},
        {"frame count + 5", [](auto& r) { return r.GotoFrame({}, 9); }, {"frame 4 1.04"}, true, stays},
        {"show 2", [](auto& r) { return r.ShowFrame({}, 2); }, {"frame 2 1.01"}, true, stays},
        {"show 0", [](auto& r) { return r.ShowFrame({}, 0); }, {}, false, stays},
        {"show 5", [](auto& r) { return r.ShowFrame({}, 5); }, {}, false, stays},
        {"by name", [](auto& r) { return r.GotoFrame(L"LIVE", 3); }, {"frame 3 1.02"}, true, stays},
        {"unknown name", [](auto& r) { return r.GotoFirst(L"Dead"); }, {}, false, stays},
        {"refresh of one that can't", [](auto& r) { return r.FetchOnce(); }, {}, false, stays},
    };
    for (const Way& way : ways)
    {
        SCOPED_TRACE(way.name);
        router.SetCurrentTime(77.0);
        EXPECT_EQ(way.go(router), way.reached);
        EXPECT_EQ(Taken(), way.told);
        EXPECT_EQ(router.GetCurrentTime(), std::isnan(way.clock) ? 77.0 : way.clock);
    }
    router.Clear();
    log.clear();
    for (const Way& way : ways)
        EXPECT_EQ(way.go(router), std::string(way.name) == "by name") << way.name << " without an active point";
}

TEST_F(Router, FindsTheFrameOfTheClock)
{
    Select();
    controller.PlayOnce();
    router.GetClock().StartOneWayClock(1.0);
    struct Moment
    {
        double advance;
        Log told;
        double time;
    };
    // The present time is then that of the frame; the wall clock goes on from where it was.
    const Moment moments[] = {{0.0, {"frame 1 1"}, 1.0},
                              {0.015, {"frame 2 1.01"}, 1.01},
                              {0.014, {"frame 3 1.02"}, 1.02},
                              {0.011, {"frame 4 1.04"}, 1.04},
                              {0.001, {}, 1.041}};
    log.clear();
    for (const Moment& moment : moments)
    {
        clock.Advance(moment.advance);
        const bool found = router.GotoTime();
        EXPECT_EQ(found, !moment.told.empty());
        EXPECT_DOUBLE_EQ(router.GetCurrentTime(), moment.time);
        EXPECT_EQ(Taken(), moment.told);
    }
}

TEST_F(Router, GoesByNumberWithoutTimeStamps)
{
    live.SetChannels({L"Body"}, {}, false);
    live.Fill({0, 0, 0});
    live.SetRecent(1);
    Select();
    EXPECT_TRUE(router.GotoTime());
    EXPECT_TRUE(router.ForwardStep());
    EXPECT_FALSE(router.ForwardStep());
    EXPECT_TRUE(router.RewindStep());
    EXPECT_TRUE(router.GotoFirst());
    EXPECT_TRUE(router.BeginSpool(2.0));
    EXPECT_EQ(Taken(), (Log{"frame 2", "frame 3", "frame 2", "frame 1"}));
}

TEST_F(Router, SpoolsWithTheSpeedSquared)
{
    live.Fill({0, 1, 2, 3, 4, 5, 6, 7, 8, 9});
    live.SetRecent(2);
    Select();
    ASSERT_TRUE(router.BeginSpool(2.0)); // from 1 s
    clock.Advance(1.0);
    router.GetClock().TickClock();
    EXPECT_TRUE(router.ForwardStep()); // 1 s, times 2 in the clock, times 2 in the point: at 5 s
    EXPECT_EQ(Taken(), (Log{"frame 6 5"}));

    live.SetRecent(9);
    ASSERT_TRUE(router.BeginSpool(0.5)); // from 8 s
    clock.Advance(4.0);
    router.GetClock().TickClock();
    EXPECT_TRUE(router.RewindStep()); // 8 - 4 * 0.5 * 0.5
    EXPECT_EQ(Taken(), (Log{"frame 8 7"}));
}

TEST_F(Router, DoesNotSpoolWithoutAFrame)
{
    EXPECT_FALSE(router.BeginSpool(1.0)) << "no point";
    Select();
    live.StartBuffer();
    EXPECT_FALSE(router.BeginSpool(1.0)) << "no frame";
}

TEST_F(Router, FetchesTheNewestFrameOnline)
{
    EXPECT_TRUE(router.FetchFrames()) << "without an active point";
    Select();
    EXPECT_TRUE(router.FetchFrames());
    EXPECT_EQ(Taken(), (Log{"frame 4 1.04"}));
    EXPECT_EQ(router.GetCurrentTime(), 1.04);

    // Of an unsafe layout the times mean nothing here.
    live.SetChannels({L"Body"}, {}, true, SimulationDataPoints::TRACK_UNSAFE);
    live.Fill({3.0});
    EXPECT_TRUE(router.FetchFrames());
    EXPECT_EQ(Taken(), (Log{"frame 1"}));
    EXPECT_EQ(router.GetCurrentTime(), 1.04);
}

TEST_F(Router, TellsOfASourceThatHasNothing)
{
    Select();
    live.streams = false;
    EXPECT_FALSE(router.FetchFrames());
    EXPECT_EQ(Taken(), (Log{"no frame"}));
    EXPECT_EQ(messages.stacks.size(), 1U);
    EXPECT_EQ(live.GetMessageStack(), nullptr) << "shown once, then gone";
}

TEST_F(Router, GivesATimeDrivenPointTheClock)
{
    live.timeDriven = true;
    Select();
    ASSERT_TRUE(router.ConnectAll()); // loops from 1.00 to 1.04
    clock.Advance(0.025);
    router.FetchFrames();
    ASSERT_NE(live.GetSimulationTime(), nullptr);
    EXPECT_DOUBLE_EQ(*live.GetSimulationTime(), 1.025);
}

TEST_F(Router, ConnectsOrSaysNothing)
{
    Select();
    EXPECT_TRUE(router.ConnectAll());
    EXPECT_EQ(Taken(), (Log{"connect Live", "mode 0"}));
    router.DisconnectAll();
    EXPECT_EQ(Taken(), (Log{"disconnect Live", "mode 1"}));
    live.connects = false;
    EXPECT_FALSE(router.ConnectAll());
    EXPECT_EQ(Taken(), (Log{"connect Live"}));
    EXPECT_EQ(userInterface.waitCursors, 0) << "each begun was ended";
}

TEST_F(Router, ReadsOnceWhileOffline)
{
    Select();
    live.refreshes = true;
    EXPECT_TRUE(router.FetchOnce());
    EXPECT_EQ(Taken(), (Log{"fetch Live", "frame 1"}));
}

TEST_F(Router, GivesTheBufferSizeToAllPointsAndLaterOnes)
{
    router.SetFrameBufferSize(1234);
    EXPECT_EQ(live.GetFrameBufferSizeEx(), 1234);
    EXPECT_EQ(Add(L"Later").GetFrameBufferSizeEx(), 1234);
}

// A dialog that closes on what it is told must not be called again, nor cost its neighbour the call.
TEST_F(Router, LetsListenersGoWhileTheyAreCalled)
{
    class Leaving : public Listener
    {
    public:
        Leaving(Log& shared, VtCSimulationDataRouter& owner) : Listener(shared), router(owner) {}
        void OnModeChanged(VtESimulationMode) override
        {
            log.push_back("leaving");
            router.RemoveChangeObject(this);
        }
        VtCSimulationDataRouter& router;
    };
    Leaving leaving(log, router);
    Listener behind(log);
    router.AddChangeObject(&leaving);
    router.AddChangeObject(&behind);
    log.clear();
    router.NotifyMode(VtESimulationMode::Online);
    EXPECT_EQ(Taken(), (Log{"mode 0", "leaving", "mode 0"}));
    router.NotifyMode(VtESimulationMode::Online);
    EXPECT_EQ(Taken(), (Log{"mode 0", "mode 0"}));
}

TEST_F(Router, ReleasesPointsLastFirst)
{
    Add(L"Second");
    log.clear();
    router.UnloadPlugins();
    EXPECT_EQ(log, (Log{"release Second", "release Live"}));
}

} // namespace
