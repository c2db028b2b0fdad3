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
        {::playOnce, PlayOnce, 2, true},         {::playOnce, PlayOnce, 4, false},
        {::playOnce, PlayLoop, 2, false},        {::playLoop, PlayLoop, 4, true},
        {::playLoop, PlayOnce, 2, false},        {::spoolBack, SpoolBackward, 2, true},
        {::spoolBack, SpoolForward, 2, false},   {::spoolForward, SpoolForward, 2, true},
        {::spoolForward, PlayStopped, 2, false},
    };
    for (const Case& c : cases)
    {
        Force(c.state, c.cursor);
        EXPECT_EQ(Checked(c.command), c.checked) << c.command << " on frame " << c.cursor;
        EXPECT_EQ(controller.GetPlayState(), c.state);
    }
}

TEST_F(Controller, EndsASpoolThatReachedTheEnd)
{
    Force(VtEPlayState::SpoolBackward, 1);
    EXPECT_FALSE(Checked(spoolBack));
    EXPECT_EQ(controller.GetPlayState(), VtEPlayState::PlayStopped);
    Force(VtEPlayState::SpoolForward, 4);
    EXPECT_FALSE(Enabled(spoolForward));
    EXPECT_EQ(controller.GetPlayState(), VtEPlayState::PlayStopped);
    // The other button of the pair leaves it alone.
    Force(VtEPlayState::SpoolForward, 4);
    EXPECT_TRUE(Enabled(spoolBack));
    EXPECT_EQ(controller.GetPlayState(), VtEPlayState::SpoolForward);
}

TEST_F(Controller, DisablesEverythingWithoutConfigurationOrOnline)
{
    const std::uint32_t frameCommands[] = {start, store,    refreshData, first,    previous,  next,        last,
                                           video, playLoop, playOnce,    stopPlay, spoolBack, spoolForward};
    live.SetRecent(2);
    live.path.clear();
    for (const std::uint32_t command : frameCommands)
        EXPECT_FALSE(Enabled(command)) << command << " not configured";
    live.path = L"bench";
    controller.Start();
    for (const std::uint32_t command : frameCommands)
        EXPECT_FALSE(Enabled(command)) << command << " online";
    EXPECT_FALSE(Enabled(pointList));
    EXPECT_TRUE(Enabled(stop));
}

TEST_F(Controller, DisablesPlayWithASingleOrNoFrame)
{
    live.Fill({0.0});
    EXPECT_FALSE(Enabled(playOnce));
    EXPECT_TRUE(Enabled(playLoop));
    live.StartBuffer();
    EXPECT_FALSE(Enabled(playLoop));
    EXPECT_FALSE(Enabled(store));
    EXPECT_FALSE(Enabled(next));
}

TEST_F(Controller, GoesOnlineAndOffline)
{
    controller.Start();
    EXPECT_EQ(Taken(), (Log{"connect Live", "mode 0"}));
    EXPECT_TRUE(controller.IsOnline());
    controller.Start();
    EXPECT_EQ(Taken(), Log{}) << "online already";
    controller.SetPlayState(L"Live", VtEPlayState::PlayLoop);
    EXPECT_FALSE(controller.HasPlayState()) << "play states are for offline";
    controller.Stop();
    EXPECT_EQ(Taken(), (Log{"disconnect Live", "mode 1"}));
    EXPECT_FALSE(controller.IsOnline());
}

TEST_F(Controller, StaysOfflineWhenThePointDoesNotConnect)
{
    live.connects = false;
    controller.Start();
    EXPECT_FALSE(controller.IsOnline());
    EXPECT_EQ(Taken(), (Log{"connect Live"}));
    EXPECT_EQ(messages.stacks.size(), 1U);
    EXPECT_EQ(live.GetMessageStack(), nullptr);
}

TEST_F(Controller, DoesNotStartWithoutAPoint)
{
    router.Clear();
    log.clear();
    controller.Start();
    EXPECT_FALSE(controller.IsOnline());
    EXPECT_EQ(Taken(), Log{});
}

TEST_F(Controller, GoesOfflineQuietlyWithoutTheConnection)
{
    controller.SetModeQuietly(VtESimulationMode::Online);
    EXPECT_EQ(Taken(), (Log{"connect Live", "mode 0", "mode 0"}));
    controller.SetModeQuietly(VtESimulationMode::Offline);
    EXPECT_EQ(Taken(), (Log{"mode 1"})) << "stays connected";
    EXPECT_FALSE(controller.IsOnline());
}

TEST_F(Controller, StepsOnlineUntilTheSourceFails)
{
    controller.Start();
    log.clear();
    EXPECT_TRUE(controller.Step());
    live.streams = false;
    EXPECT_FALSE(controller.Step());
    EXPECT_TRUE(controller.IsOnline()) << "the frame cycle tries again";
    EXPECT_EQ(messages.stacks.size(), 1U) << "told once a step";
    live.streams = true;
    EXPECT_TRUE(controller.Step());
    EXPECT_EQ(Taken(), (Log{"frame 4 1.04", "no frame", "frame 4 1.04"}));
}

TEST_F(Controller, PlaysOnceToTheLastFrameAndStops)
{
    live.SetRecent(1);
    controller.PlayOnce();
    EXPECT_EQ(controller.GetPlayState(), VtEPlayState::PlayOnce);
    std::vector<bool> playing;
    for (int i = 0; i < 6; ++i)
    {
        EXPECT_TRUE(controller.Step());
        playing.push_back(controller.IsPlaying());
        clock.Advance(0.015);
    }
    // At 1.000, 1.015, 1.030 and, beyond the end, 1.045 s; afterwards nothing runs.
    EXPECT_EQ(Taken(),
              (Log{"play Live 1", "frame 1 1", "frame 2 1.01", "frame 3 1.02", "frame 4 1.04", "play Live 0"}));
    EXPECT_EQ(playing, (std::vector<bool>{true, true, true, false, false, false}));
    EXPECT_EQ(router.GetRecent(L"Live"), 4UL);
    EXPECT_FALSE(Enabled(playOnce));
    EXPECT_TRUE(Enabled(first));
}

TEST_F(Controller, PlaysFromTheCursorAtItsSpeed)
{
    live.Fill({0, 1, 2, 3, 4, 5, 6, 7, 8, 9});
    for (const double speed : {0.5, 2.0})
    {
        SCOPED_TRACE(speed);
        live.SetRecent(4); // at 3 s
        controller.SetSpeed(speed);
        router.GetClock().SetSpeed(9.0); // a connection or a recording leaves its own
        controller.PlayOnce();
        clock.Advance(2.0);
        controller.Step();
        EXPECT_EQ(router.GetCurrentTime(), 3.0 + 2.0 * speed);
        controller.StopPlay();
    }
    controller.StopPlay();
    EXPECT_EQ(Taken(), (Log{"play Live 1", "frame 5 4", "play Live 0", "play Live 1", "frame 8 7", "play Live 0"}));
}

TEST_F(Controller, LoopsByTheClock)
{
    live.Fill({0, 1, 2, 3, 4});
    live.SetRecent(4);
    controller.PlayLoop();
    log.clear();
    for (int i = 0; i < 4; ++i)
    {
        controller.Step();
        clock.Advance(0.75);
    }
    EXPECT_EQ(Taken(), (Log{"frame 4 3", "frame 4 3", "frame 1 0", "frame 2 1"})); // 3, 3.75, 0.5 and 1.25 s
    EXPECT_EQ(controller.GetPlayState(), VtEPlayState::PlayLoop);
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

TEST_F(Controller, StopsPlayingOverAnEmptyBuffer)
{
    live.StartBuffer();
    for (const bool loop : {false, true})
    {
        loop ? controller.PlayLoop() : controller.PlayOnce();
        log.clear();
        EXPECT_TRUE(controller.Step());
        EXPECT_EQ(Taken(), (Log{"play Live 0"}));
    }
}

TEST_F(Controller, SpoolsWhileTheButtonIsDown)
{
    live.Fill({0, 1, 2, 3, 4});
    live.SetRecent(4);
    ASSERT_TRUE(controller.BeginSpool(1.0));
    controller.SetPlayState(L"Live", VtEPlayState::SpoolBackward);
    clock.Advance(2.0);
    controller.Step();
    EXPECT_EQ(controller.GetPlayState(), VtEPlayState::SpoolBackward);
    clock.Advance(2.0); // one second beyond the start: shown once, then the spool ends
    controller.Step();
    controller.Step();
    EXPECT_EQ(controller.GetPlayState(), VtEPlayState::PlayStopped);
    EXPECT_EQ(Taken(), (Log{"frame 2 1", "frame 1 0", "play Live 0"}));
    controller.SetPlayState(L"", VtEPlayState::SpoolForward);
    EXPECT_FALSE(controller.HasPlayState()) << "a state needs a point";
}

TEST_F(Controller, ResetEndsEverything)
{
    controller.PlayLoop();
    controller.Reset();
    EXPECT_FALSE(controller.HasPlayState());
    EXPECT_EQ(router.GetActivePoint(0), nullptr);

    router.SelectPoint(L"Live");
    controller.Start();
    controller.Reset();
    EXPECT_FALSE(controller.IsOnline());
    EXPECT_EQ(router.GetActivePoint(0), nullptr);
}

TEST_F(Controller, StepsByHandOnlyWhileNothingRuns)
{
    live.SetRecent(2);
    EXPECT_TRUE(controller.GotoNext());
    EXPECT_TRUE(controller.GotoPrevious());
    controller.PlayLoop();
    EXPECT_FALSE(controller.GotoNext());
    EXPECT_FALSE(controller.GotoPrevious());
    controller.StopPlay();
    controller.Start();
    EXPECT_FALSE(controller.GotoNext());
}

TEST_F(Controller, ShowsARefreshAsAShortRun)
{
    live.refreshes = true;
    controller.Refresh();
    EXPECT_EQ(Taken(), (Log{"mode 0", "fetch Live", "frame 1", "mode 1"}));
}

TEST_F(Controller, RecordsByTheScaledClock)
{
    controller.PlayForRecording(1.0, 1.0);
    EXPECT_EQ(controller.GetPlayState(), VtEPlayState::PlayLoop);
    clock.Advance(10.0);
    controller.SetCurrentTime(1.02);
    log.clear();
    controller.Step();
    EXPECT_EQ(Taken(), (Log{"frame 3 1.02"}));
    controller.ResetPlayState();
    EXPECT_EQ(Taken(), Log{}) << "nobody is told";
    EXPECT_FALSE(controller.HasPlayState());
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
        {38717, {"disconnect Live", "cleared "}},
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

TEST_F(Controller, TellsPointsThatTheyAreChosen)
{
    Add(L"Other");
    controller.ChoosePoint(L"Live");
    EXPECT_EQ(Taken(), (Log{"select Live"}));
    controller.ChoosePoint(L"live");
    EXPECT_EQ(Taken(), Log{});
    controller.ChoosePoint(L"Other");
    EXPECT_EQ(Taken(), (Log{"deselect Live", "select Other", "selected Other|TEST|bench"}));
    controller.ChoosePoint(L"");
    EXPECT_EQ(Taken(), (Log{"deselect Other", "disconnect Other", "cleared "}));
}

TEST_F(Controller, AsksWhereToStore)
{
    controller.OnCmdMsg(store);
    ASSERT_EQ(questions.asked.size(), 1U);
    EXPECT_EQ(questions.asked[0].filter, L"Motion Data file (*.mdf)|*.mdf||");
    EXPECT_EQ(questions.asked[0].defaultExtension, L"mdf");
    EXPECT_EQ(questions.asked[0].initialName, L"*.mdf");
    EXPECT_FALSE(messages.Has(host::Severity::error, 530)) << "declined";

    questions.answer = L"out\\run.mdf"; // there is no File module here to write with
    controller.OnCmdMsg(store);
    EXPECT_TRUE(messages.Has(host::Severity::error, 530));
    EXPECT_EQ(messages.shown.back().first, L"out\\run.mdf");
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

} // namespace
