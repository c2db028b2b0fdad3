#include <functional>

#include "simdata/tests/SimulationFixture.h"

using namespace simtest;

namespace
{

enum Command : std::uint32_t
{
    pointList = 6241,
    speedControl = 6681,
    start = 38714,
    stop = 38715,
    customise = 38716,
    store = 38743,
    refreshData = 38744,
    first = 38745,
    previous = 38746,
    stopPlay = 38747,
    next = 38748,
    last = 38749,
    playLoop = 38750,
    playOnce = 38751,
    spoolBack = 38752,
    spoolForward = 38753,
    video = 38900,
};

class Controller : public SimulationTest
{
protected:
    Controller() : listener(log)
    {
        router.AddChangeObject(&listener);
        router.SelectPoint(L"Live");
        log.clear();
    }
    ~Controller() override { router.RemoveChangeObject(&listener); }

    bool Enabled(std::uint32_t command) { return controller.IsCommandEnabled(L"Live", command).enabled; }
    bool Checked(std::uint32_t command) { return controller.IsCommandEnabled(L"Live", command).checked; }

    /// Puts the controller into a state without going through the operations under test.
    void Force(VtEPlayState state, unsigned long cursor)
    {
        controller.SetPlayState(L"Live", state);
        live.SetRecent(cursor);
    }

    Listener listener;
};

// Which of the four cursor places enable a command; the buffer holds four frames.
enum Place : unsigned
{
    nowhere = 0,
    atFirst = 1,
    inside = 2,
    atLast = 4,
    anywhere = 7,
};

struct Row
{
    std::uint32_t command;
    unsigned stopped, once, loop, back, forward; ///< where it is enabled, by play state
};

TEST_F(Controller, EnablesCommandsByPlayStateAndCursor)
{
    live.refreshes = true;
    constexpr unsigned behind = inside | atLast;
    constexpr unsigned ahead = atFirst | inside;
    const Row rows[] = {
        {speedControl, anywhere, nowhere, nowhere, anywhere, anywhere},
        {pointList, anywhere, nowhere, nowhere, anywhere, anywhere},
        {customise, anywhere, nowhere, nowhere, anywhere, anywhere},
        {stop, nowhere, nowhere, nowhere, nowhere, nowhere},
        {start, anywhere, nowhere, nowhere, anywhere, anywhere},
        {refreshData, anywhere, nowhere, nowhere, anywhere, anywhere},
        {store, anywhere, nowhere, nowhere, anywhere, anywhere},
        {video, anywhere, nowhere, nowhere, anywhere, anywhere},
        {first, behind, nowhere, nowhere, behind, behind},
        {previous, behind, nowhere, nowhere, behind, behind},
        {spoolBack, behind, nowhere, nowhere, behind, behind},
        {stopPlay, nowhere, anywhere, anywhere, nowhere, nowhere},
        {next, ahead, nowhere, nowhere, ahead, ahead},
        {last, ahead, nowhere, nowhere, ahead, ahead},
        {spoolForward, ahead, nowhere, nowhere, ahead, ahead},
        {playLoop, anywhere, nowhere, anywhere, anywhere, anywhere},
        {playOnce, ahead, ahead, nowhere, ahead, ahead},
        {38713, nowhere, nowhere, nowhere, nowhere, nowhere},
    };
    for (const Row& row : rows)
    {
        const unsigned byState[] = {row.stopped, row.once, row.loop, row.back, row.forward};
        for (int state = 0; state < 5; ++state)
            for (const auto& [place, cursor] : {std::pair{atFirst, 1UL}, {inside, 3UL}, {atLast, 4UL}})
            {
                Force(static_cast<VtEPlayState>(state), cursor);
                EXPECT_EQ(Enabled(row.command), (byState[state] & place) != 0)
                    << row.command << " in state " << state << " on frame " << cursor;
            }
    }
}

TEST_F(Controller, ChecksWhatRuns)
{
    struct Case
    {
        std::uint32_t command;
        VtEPlayState state;
        unsigned long cursor;
        bool checked;
    };
    using enum VtEPlayState;
    const Case cases[] = {
        {::playOnce, PlayOnce, 2, true},          {::playOnce, PlayOnce, 4, false},
        {::playOnce, PlayLoop, 2, false},         {::playLoop, PlayLoop, 4, true},
        {::playLoop, PlayOnce, 2, false},         {::spoolBack, SpoolBackward, 2, true},
        {::spoolBack, SpoolForward, 2, false},    {::spoolForward, SpoolForward, 2, true},
        {::spoolForward, PlayStopped, 2, false},  {::spoolBack, SpoolBackward, 1, false},
        {::spoolForward, SpoolForward, 4, false},
    };
    for (const Case& c : cases)
    {
        Force(c.state, c.cursor);
        EXPECT_EQ(Checked(c.command), c.checked) << c.command << " on frame " << c.cursor;
        EXPECT_EQ(controller.GetPlayState(), c.state) << "a question ends nothing";
    }
}

TEST_F(Controller, AsksEachPointForItsOwnCommands)
{
    const std::uint32_t frameCommands[] = {start, store,    refreshData, first,    previous,  next,        last,
                                           video, playLoop, playOnce,    stopPlay, spoolBack, spoolForward};
    Point& other = Add(L"Other");
    other.SetChannels({L"Body"});
    other.Fill({0.0});
    live.SetRecent(2);
    EXPECT_TRUE(Enabled(first));
    const auto enabled = [&](const wchar_t* name, std::uint32_t command)
    { return controller.IsCommandEnabled(name, command).enabled; };
    EXPECT_FALSE(enabled(L"Other", first)) << "its cursor is on the first of one frame";
    EXPECT_FALSE(enabled(L"Other", playOnce));
    EXPECT_TRUE(enabled(L"other", playLoop));
    EXPECT_TRUE(enabled(L"", first)) << "without a name the active point answers";
    other.refreshes = true;
    EXPECT_TRUE(enabled(L"Other", refreshData));
    EXPECT_FALSE(enabled(L"", refreshData));
    other.StartBuffer();
    for (const std::uint32_t command : {playLoop, store, next})
        EXPECT_FALSE(enabled(L"Other", command)) << "without a frame";

    live.path.clear();
    for (const std::uint32_t command : frameCommands)
    {
        EXPECT_FALSE(Enabled(command)) << command << " not configured";
        EXPECT_FALSE(enabled(L"unknown", command)) << command;
    }
    live.path = L"bench";
    controller.Start();
    for (const std::uint32_t command : frameCommands)
        EXPECT_FALSE(Enabled(command)) << command << " online";
    EXPECT_FALSE(Enabled(pointList));
    EXPECT_TRUE(Enabled(stop));
}

TEST_F(Controller, GoesOnlineAndOffline)
{
    struct Change
    {
        const char* name;
        std::function<void(VtCSimulationDataController&)> change;
        Log told;
        bool online;
    };
    using enum VtESimulationMode;
    const Change changes[] = {
        {"start", [](auto& c) { c.Start(); }, {"connect Live", "mode 0"}, true},
        {"again", [](auto& c) { c.Start(); }, {}, true},
        {"no play states online", [](auto& c) { c.SetPlayState(L"Live", VtEPlayState::PlayLoop); }, {}, true},
        {"no steps by hand", [](auto& c) { c.GotoNext() || c.GotoPrevious(); }, {}, true},
        {"stop", [](auto& c) { c.Stop(); }, {"disconnect Live", "mode 1"}, false},
        {"quietly on", [](auto& c) { c.SetModeQuietly(Online); }, {"connect Live", "mode 0", "mode 0"}, true},
        {"quietly off, still connected", [](auto& c) { c.SetModeQuietly(Offline); }, {"mode 1"}, false},
        {"nothing runs without a point",
         [](auto& c) { c.Reset(), c.Start(); },
         {"deselect Live", "disconnect Live", "cleared "},
         false},
    };
    for (const Change& change : changes)
    {
        SCOPED_TRACE(change.name);
        change.change(controller);
        EXPECT_EQ(Taken(), change.told);
        EXPECT_EQ(controller.IsOnline(), change.online);
        EXPECT_FALSE(controller.HasPlayState());
    }
    EXPECT_EQ(userInterface.waitCursors, 0) << "each begun was ended";

    router.SelectPoint(L"Live");
    live.connects = false;
    controller.Start();
    EXPECT_FALSE(controller.IsOnline());
    EXPECT_EQ(messages.stacks.size(), 1U) << "with the reason";
    EXPECT_EQ(live.GetMessageStack(), nullptr);

    live.connects = true;
    controller.Start();
    log.clear();
    for (const bool streams : {true, false, true})
    {
        live.streams = streams;
        EXPECT_EQ(controller.Step(), streams);
        EXPECT_TRUE(controller.IsOnline()) << "the frame cycle tries again";
    }
    EXPECT_EQ(Taken(), (Log{"frame 4 1.04", "no frame", "frame 4 1.04"}));
    EXPECT_EQ(messages.stacks.size(), 2U) << "told once a step";
    controller.Reset();
    EXPECT_FALSE(controller.IsOnline());
    EXPECT_EQ(router.GetActivePoint(), nullptr);
}

TEST_F(Controller, PlaysOnceToTheLastFrameAndStops)
{
    live.SetRecent(1);
    controller.PlayLoop();
    controller.StopPlay();
    log.clear();
    controller.PlayOnce(); // after a loop too it ends: the buffer doesn't repeat any more
    std::vector<bool> playing;
    for (int i = 0; i < 6; ++i)
    {
        EXPECT_TRUE(controller.Step());
        playing.push_back(controller.IsPlaying());
        EXPECT_FALSE(playing.back() && (controller.GotoNext() || controller.GotoPrevious())) << "steps by hand";
        clock.Advance(0.015);
    }
    // At 1.000, 1.015, 1.030 and, beyond the end, 1.045 s; afterwards nothing runs.
    EXPECT_EQ(Taken(),
              (Log{"play Live 1", "frame 1 1", "frame 2 1.01", "frame 3 1.02", "frame 4 1.04", "play Live 0"}));
    EXPECT_EQ(playing, (std::vector<bool>{true, true, true, false, false, false}));
    EXPECT_FALSE(Enabled(playOnce));
    EXPECT_TRUE(Enabled(first));

    live.StartBuffer();
    for (const bool loop : {false, true})
    {
        loop ? controller.PlayLoop() : controller.PlayOnce();
        log.clear();
        EXPECT_TRUE(controller.Step());
        EXPECT_EQ(Taken(), (Log{"play Live 0"})) << "over an empty buffer";
    }
}

TEST_F(Controller, PlaysFromTheCursorAtItsSpeed)
{
    live.Fill({0, 1, 2, 3, 4, 5, 6, 7, 8, 9});
    struct Run
    {
        const char* name;
        double speed;
        std::function<void(VtCSimulationDataController&)> play;
        double seconds, time; ///< from 3 s on
    };
    const auto once = [](auto& c) { c.PlayOnce(); };
    const auto loop = [](auto& c) { c.PlayLoop(); };
    const auto record = [](auto& c) { c.PlayForRecording(3.0, 0.5), c.SetCurrentTime(9.0); };
    const Run runs[] = {
        {"once, half as fast", 0.5, once, 2.0, 4.0},
        {"once, twice as fast", 2.0, once, 2.0, 7.0},
        {"a loop, half as fast", 0.5, loop, 2.0, 4.0},
        {"a loop, twice as fast", 2.0, loop, 2.0, 7.0},
        {"a loop, over the end", 2.0, loop, 4.0, 2.0}, // 11 s: 2 beyond the end at 9
        {"a recorder's time, scaled once, and no wall clock", 4.0, record, 100.0, 6.0},
    };
    for (const Run& run : runs)
    {
        SCOPED_TRACE(run.name);
        live.SetRecent(4);
        controller.SetSpeed(run.speed);
        router.GetClock().SetSpeed(9.0); // a connection or a recording leaves its own
        run.play(controller);
        clock.Advance(run.seconds);
        controller.Step();
        EXPECT_EQ(router.GetCurrentTime(), run.time);
        EXPECT_TRUE(controller.IsPlaying());
        log.clear();
        controller.ResetPlayState();
        EXPECT_EQ(Taken(), Log{}) << "nobody is told";
        EXPECT_FALSE(controller.HasPlayState());
    }
}

TEST_F(Controller, LoopsByNumberWithoutTimeStamps)
{
    live.SetChannels({L"Body"}, {}, false);
    live.Fill({0, 0, 0});
    live.SetRecent(2);
    controller.PlayLoop();
    log.clear();
    for (int i = 0; i < 3; ++i)
        controller.Step();
    EXPECT_EQ(Taken(), (Log{"frame 3", "frame 1", "frame 2"}));
    EXPECT_TRUE(controller.IsPlaying());
}

TEST_F(Controller, SpoolsToTheEndsAndStopsThere)
{
    live.Fill({0, 1, 2, 3, 4});
    controller.PlayLoop();
    controller.StopPlay(); // a loop before makes no difference
    struct Case
    {
        VtEPlayState state;
        Log told;
    };
    const Case cases[] = {{VtEPlayState::SpoolBackward, {"frame 2 1", "frame 1 0", "play Live 0"}},
                          {VtEPlayState::SpoolForward, {"frame 4 3", "frame 5 4", "play Live 0"}}};
    for (const Case& c : cases)
    {
        live.SetRecent(3);
        ASSERT_TRUE(controller.BeginSpool(1.0));
        controller.SetPlayState(L"", c.state);
        EXPECT_FALSE(controller.HasPlayState()) << "a state needs a point";
        controller.SetPlayState(L"Live", c.state);
        log.clear();
        for (const double seconds : {1.0, 5.0, 1.0})
        {
            clock.Advance(seconds);
            controller.Step();
        }
        EXPECT_EQ(Taken(), c.told);
        EXPECT_EQ(controller.GetPlayState(), VtEPlayState::PlayStopped);
    }
}

TEST_F(Controller, CarriesOutItsCommandsAndNoOthers)
{
    live.refreshes = true;
    live.SetRecent(2);
    struct Case
    {
        std::uint32_t command;
        Log told;
    };
    const Case cases[] = {
        {first, {"frame 1 1"}},
        {next, {"frame 2 1.01"}},
        {spoolForward, {"frame 3 1.02"}},
        {last, {"frame 4 1.04"}},
        {next, {}}, // disabled on the last frame, and a command of the controller still
        {previous, {"frame 3 1.02"}},
        {spoolBack, {"frame 2 1.01"}},
        {playOnce, {"play Live 1"}},
        {stopPlay, {"play Live 0"}},
        {playLoop, {"play Live 2"}},
        {start, {}}, // disabled while playing
        {stopPlay, {"play Live 0"}},
        {start, {"connect Live", "mode 0"}},
        {38717, {}}, // disabled online
        {stop, {"disconnect Live", "mode 1"}},
        {refreshData, {"mode 0", "fetch Live", "frame 1", "mode 1"}},
        {38719, {}}, // there is no second source
        {38717, {"deselect Live", "disconnect Live", "cleared "}},
        {38718, {"select Live", "selected Live|TEST|bench"}},
    };
    for (const Case& c : cases)
    {
        EXPECT_TRUE(controller.OnCmdMsg(c.command)) << c.command;
        EXPECT_EQ(Taken(), c.told) << c.command;
    }
    for (const std::uint32_t stranger : {0U, 38712U, 38724U, 38742U, 38754U, pointList + 0U, speedControl + 0U})
        EXPECT_FALSE(controller.OnCmdMsg(stranger)) << stranger;

    const int asked = live.channelQuestions;
    EXPECT_TRUE(controller.OnCmdMsg(38713));
    EXPECT_GT(live.channelQuestions, asked);

    EXPECT_TRUE(controller.OnCmdMsg(store));
    ASSERT_EQ(questions.asked.size(), 1U);
    EXPECT_EQ(questions.asked[0].filter, L"Motion Data file (*.mdf)|*.mdf||");
    EXPECT_EQ(questions.asked[0].defaultExtension, L"mdf");
    EXPECT_EQ(questions.asked[0].initialName, L"*.mdf");
    EXPECT_FALSE(messages.Has(host::Severity::error, 530)) << "declined";
}

TEST_F(Controller, ListsTheSourcesInItsMenu)
{
    Add(L"Sink").source = false;
    Add(L"Other").path = L"elsewhere";
    const auto second = controller.GetMenuState(38719);
    ASSERT_TRUE(second);
    EXPECT_EQ(second->text, L"Other|TEST|elsewhere");
    EXPECT_TRUE(second->enabled);
    EXPECT_FALSE(second->checked);
    EXPECT_TRUE(controller.GetMenuState(38718)->checked);
    EXPECT_FALSE(controller.GetMenuState(38717)->checked);
    controller.Start();
    EXPECT_FALSE(controller.GetMenuState(38719)->enabled);
}

TEST_F(Controller, KeepsBufferSizesWithTheHost)
{
    EXPECT_EQ(controller.GetSimulationBufferFrames(), 10000);
    EXPECT_EQ(controller.GetTrackBufferFrames(), 20000);
    EXPECT_FALSE(controller.SetBufferSizes(10000, 20000));
    EXPECT_TRUE(controller.SetBufferSizes(12000, 18000));
    EXPECT_EQ(configuration.simulationBufferFrames, 12000);
    EXPECT_EQ(configuration.trackBufferFrames, 18000);
    EXPECT_EQ(live.GetFrameBufferSizeEx(), 10000) << "takes effect with the next controller";
    configuration.simulationBufferFrames = -5;
    EXPECT_EQ(VtCSimulationDataController(Make()).GetSimulationBufferFrames(), 1000);
}

TEST_F(Controller, AnswersForTheBufferOfTheActivePoint)
{
    EXPECT_EQ(controller.GetTrackSafety(), SimulationDataPoints::TRACK_SAFE);
    const auto copy = controller.CopyFrameBuffer();
    ASSERT_TRUE(copy);
    EXPECT_EQ(copy->GetCount(), 4);
    EXPECT_EQ(copy->ComputeLatestTime(), 1.04);
    router.Clear();
    EXPECT_EQ(controller.GetTrackSafety(), SimulationDataPoints::TRACK_UNSAFE);
    EXPECT_EQ(controller.CopyFrameBuffer(), nullptr);
    EXPECT_EQ(controller.GetFrameBufferSize(), 0);
}

TEST_F(Controller, LightsTheIndicatorForTheTrackInTheTreeOnly)
{
    class Navigator : public VtINavigatorState
    {
    public:
        bool IsTrackCurrent() const override { return track; }
        bool track = true;
    } navigator;
    VtTSimulationServices services = Make();
    services.navigator = &navigator;
    VtCSimulationDataController other(services);
    bool& shown = variables.bools[L"simulationRunning"];
    other.PlayLoop();
    EXPECT_TRUE(shown);
    other.StopPlay();
    EXPECT_FALSE(shown);
    navigator.track = false;
    other.PlayLoop();
    EXPECT_FALSE(shown);
}

// A point that takes one file and no other.
class FilePoint : public Point
{
public:
    using Point::Point;
    int Configure(const std::wstring&, const std::wstring& newPath, int, int) override
    {
        if (newPath == L"good.mdf")
            return path = newPath, 1;
        Say(L"no motion data");
        return 0;
    }
};

TEST_F(Controller, LeavesTheRunAloneWhenAFileCannotBeLoaded)
{
    EXPECT_FALSE(controller.LoadMotionData(L"good.mdf"));
    EXPECT_TRUE(messages.Has(host::Severity::error, 9030)) << "there is no point for files";
    auto& file = static_cast<FilePoint&>(router.AddPoint(VtTDataPointPtr(new FilePoint(L"File", &log))));
    file.SetChannels({L"Body"});
    file.Fill({5.0, 6.0});
    file.SetRecent(2);
    controller.PlayLoop();
    log.clear();
    EXPECT_FALSE(controller.LoadMotionData(L"bad.mdf"));
    EXPECT_EQ(Taken(), Log{}) << "neither choice nor replay have changed";
    EXPECT_EQ(messages.stacks.size(), 1U);

    const Log loaded = {"play Live 0", "deselect Live", "select File", "selected File|TEST|good.mdf", "frame 1 5"};
    EXPECT_TRUE(controller.LoadMotionData(L"good.mdf"));
    EXPECT_EQ(Taken(), loaded);
    EXPECT_FALSE(controller.LoadMotionData(L"bad.mdf"));
    EXPECT_EQ(Taken(), Log{});
    EXPECT_TRUE(controller.LoadMotionData(L"good.mdf"));
    EXPECT_EQ(Taken(), (Log{"selected File|TEST|good.mdf", "frame 1 5"})) << "another file of the same point";
    EXPECT_FALSE(progress.activities[41].connected);
}

} // namespace
