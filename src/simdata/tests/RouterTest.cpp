#include <algorithm>
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

TEST_F(Router, KnowsItsPointsByNameAndRole)
{
    EXPECT_EQ(Taken(), Log{"points"}) << "a new listener is told of them";
    EXPECT_TRUE(messages.Has(host::Severity::error, 303)) << "no module gave one";
    Point& sink = Add(L"Recorder");
    sink.source = false;
    sink.sink = true;
    using Names = std::vector<std::wstring>;
    EXPECT_EQ(router.GetPointNames(VtCSimulationDataRouter::sources), (Names{L"Live"}));
    EXPECT_EQ(router.GetPointNames(VtCSimulationDataRouter::sinks), (Names{L"Recorder"}));
    EXPECT_EQ(router.GetPointNames(VtCSimulationDataRouter::sources | VtCSimulationDataRouter::sinks),
              (Names{L"Live", L"Recorder"}));
    EXPECT_EQ(router.GetPointNames(VtCSimulationDataRouter::scene), Names{}) << "without a document";

    EXPECT_EQ(router.FindPoint(L"lIvE"), &live);
    EXPECT_EQ(router.FindPoint(L""), nullptr);
    EXPECT_EQ(router.FindPoint(L"Liv"), nullptr);
    router.SetFrameBufferSize(1234);
    Point& second = Add(L"LIVE");
    EXPECT_EQ(router.FindPoint(L"live"), &second) << "the last of a name";
    EXPECT_EQ(live.GetFrameBufferSizeEx() + second.GetFrameBufferSizeEx(), 2 * 1234);
    log.clear();
    router.UnloadPlugins();
    EXPECT_EQ(log, (Log{"release LIVE", "release Recorder", "release Live"}));
}

TEST_F(Router, KeepsTheOneChoiceAndTellsBothPoints)
{
    Add(L"Recorder").source = false;
    Add(L"Other");
    log.clear();
    struct Choice
    {
        const wchar_t* name; ///< empty: none
        Log told;
        const wchar_t* active;
    };
    const Choice choices[] = {
        {L"Live", {"select Live", "selected Live|TEST|bench"}, L"Live"},
        {L"LIVE", {}, L"Live"},
        {L"Recorder", {}, L"Live"},
        {L"unknown", {}, L"Live"},
        {L"other", {"deselect Live", "select Other", "selected Other|TEST|bench"}, L"Other"},
        {L"", {"deselect Other", "disconnect Other", "cleared "}, L""},
        {L"", {}, L""},
        {L"Live", {"select Live", "selected Live|TEST|bench"}, L"Live"},
    };
    for (const Choice& choice : choices)
    {
        SCOPED_TRACE(testing::PrintToString(std::wstring(choice.name)));
        controller.ChoosePoint(choice.name);
        EXPECT_EQ(Taken(), choice.told);
        EXPECT_EQ(router.GetActivePointName(), choice.active);
        EXPECT_EQ(variables.texts[L"simulationDatapointInfo"],
                  *choice.active ? L"SimulationDataPoint-" + std::wstring(choice.active) : L"No SimulationDataPoint");
    }
    router.SetCurrentTime(3.0);
    router.Clear();
    EXPECT_EQ(Taken(), (Log{"deselect Live", "disconnect Live", "cleared "}));
    EXPECT_EQ(router.GetCurrentTime(), 0.0);
    EXPECT_EQ(router.GetCurrentChannels(), nullptr);
}

TEST_F(Router, PreloadsAPointThatIsEmptyAndMayStream)
{
    struct Case
    {
        const char* name;
        bool preloads;
        int streamMode;
        bool full;
        std::ptrdiff_t fetches;
    };
    const Case cases[] = {
        {"empty", true, 1, false, 1},
        {"can't", false, 1, false, 0},
        {"a look at the header", true, 0, false, 0},
        {"has frames", true, 1, true, 0},
    };
    for (const Case& c : cases)
    {
        Point& point = Add(L"Preloader");
        point.SetChannels({L"Body"});
        point.preloads = c.preloads;
        point.SetInitialStreamMode(c.streamMode);
        if (c.full)
            point.Fill({0.0});
        log.clear();
        router.SelectPoint(L"Preloader");
        EXPECT_EQ(std::count(log.begin(), log.end(), "fetch Preloader"), c.fetches) << c.name;
        router.Clear();
    }
}

TEST_F(Router, KeepsTheChannelListsUntilTheConfigurationChanges)
{
    Instruments instruments;
    scene.instruments = &instruments;
    Add(L"Poses").SetChannels({L"Body"});
    router.SelectPoint(L"Poses");
    EXPECT_EQ(instruments.mode, VtEInstrumentDataMode::LegacyStreams);
    Select();
    EXPECT_EQ(instruments.mode, VtEInstrumentDataMode::SignalNames) << "by name once there are names";
    instruments.mode = VtEInstrumentDataMode::LegacyStreams;

    using Names = std::vector<std::wstring>;
    using Streams = std::vector<SimulationDataPoints::VtTInstrumentStream>;
    EXPECT_EQ(*router.GetCurrentChannels(), (Names{L"Body", L"Wheel"}));
    EXPECT_EQ(router.GetActiveChannels().instruments, (Streams{{L"Speed", L"m/s"}}));
    EXPECT_EQ(router.GetChannelLists(0).instruments, (Streams{{L"Speed", L"m/s"}}));
    EXPECT_EQ(instruments.mode, VtEInstrumentDataMode::LegacyStreams) << "a question changes nothing";
    const int asked = live.channelQuestions;
    router.GetCurrentChannels();
    router.GotoFirst();
    EXPECT_EQ(live.channelQuestions, asked);

    // A listener that shows the channels asks for them while it is told.
    class ChannelList : public VtCSimulationDataChangeObject
    {
    public:
        explicit ChannelList(VtCSimulationDataRouter& owner) : router(owner) { router.AddChangeObject(this); }
        ~ChannelList() override { router.RemoveChangeObject(this); }
        void OnDataPointSelected(const std::wstring&) override { shown = *router.GetCurrentChannels(); }
        VtCSimulationDataRouter& router;
        Names shown;
    } list(router);
    live.SetChannels({L"Trailer"});
    router.NotifyConfiguration(router.GetConfigurationText(L"Live", 0));
    EXPECT_EQ(*router.GetCurrentChannels(), (Names{L"Trailer"}));
    EXPECT_EQ(list.shown, (Names{L"Trailer"}));
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
        {"the clock's time",
         [](auto& r)
         {
             r.SetCurrentTime(1.015);
             return r.GotoTime();
         },
         {"frame 2 1.01"},
         true,
         1.01},
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
    live.refreshes = true;
    EXPECT_TRUE(router.FetchOnce());
    EXPECT_EQ(Taken(), (Log{"frame 2", "frame 3", "frame 2", "frame 1", "fetch Live", "frame 1"}));
}

TEST_F(Router, SpoolsWithTheSpeedSquared)
{
    EXPECT_FALSE(router.BeginSpool(1.0)) << "no point";
    Select();
    live.StartBuffer();
    EXPECT_FALSE(router.BeginSpool(1.0)) << "no frame";
    live.Fill({0, 1, 2, 3, 4, 5, 6, 7, 8, 9});
    live.SetRecent(2);
    ASSERT_TRUE(router.BeginSpool(2.0)); // from 1 s
    clock.Advance(1.0);
    router.GetClock().TickClock();
    EXPECT_TRUE(router.ForwardStep()); // 1 s, times 2 in the clock, times 2 in the point: at 5 s
    live.SetRecent(9);
    ASSERT_TRUE(router.BeginSpool(0.5)); // from 8 s
    clock.Advance(4.0);
    router.GetClock().TickClock();
    EXPECT_TRUE(router.RewindStep()); // 8 - 4 * 0.5 * 0.5
    EXPECT_EQ(Taken(), (Log{"frame 6 5", "frame 8 7"}));
}

TEST_F(Router, FetchesTheNewestFrameOnline)
{
    EXPECT_TRUE(router.FetchFrames()) << "without an active point";
    live.timeDriven = true;
    Select();
    ASSERT_TRUE(router.ConnectAll()); // the clock loops from 1.00 to 1.04
    EXPECT_EQ(Taken(), (Log{"connect Live", "mode 0"}));
    clock.Advance(0.025);
    router.GetClock().TickClock();
    EXPECT_TRUE(router.FetchFrames());
    EXPECT_DOUBLE_EQ(*live.GetSimulationTime(), 1.025);
    EXPECT_EQ(Taken(), (Log{"frame 4 1.04"}));
    EXPECT_EQ(router.GetCurrentTime(), 1.04);

    // Of an unsafe layout the times mean nothing here.
    live.SetChannels({L"Body"}, {}, true, SimulationDataPoints::TRACK_UNSAFE);
    live.Fill({3.0});
    EXPECT_TRUE(router.FetchFrames());
    EXPECT_EQ(Taken(), (Log{"frame 1"}));
    EXPECT_EQ(router.GetCurrentTime(), 1.04);

    live.streams = false;
    EXPECT_FALSE(router.FetchFrames());
    EXPECT_EQ(Taken(), (Log{"no frame"}));
    EXPECT_EQ(messages.stacks.size(), 1U);
    EXPECT_EQ(live.GetMessageStack(), nullptr) << "shown once, then gone";
    router.DisconnectAll();
    EXPECT_EQ(Taken(), (Log{"disconnect Live", "mode 1"}));
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
    for (VtCSimulationDataChangeObject* added : {static_cast<Listener*>(&leaving), &behind, &behind})
        router.AddChangeObject(added);
    log.clear();
    router.NotifyMode(VtESimulationMode::Online);
    router.NotifyMode(VtESimulationMode::Online);
    EXPECT_EQ(log, (Log{"mode 0", "leaving", "mode 0", "mode 0", "mode 0"}));
}

} // namespace
