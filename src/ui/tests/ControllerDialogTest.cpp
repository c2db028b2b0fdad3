#include "tests/support/HeapCount.h"
#include "ui/tests/DialogFixture.h"

using namespace simtest;
using namespace ControllerCommand;

namespace
{

class Dialog : public uitest::DialogTest
{
protected:
    /// A timer event, and what it changed on the window.
    int UpdatesOfTick()
    {
        const int before = view.updates;
        dialog->OnTimer();
        return view.updates - before;
    }

    using Texts = std::vector<std::wstring>;
};

TEST_F(Dialog, StartsWithNormalSpeedAndTheActivePoint)
{
    EXPECT_EQ(view.period, 300U);
    EXPECT_EQ(view.position, 5U);
    EXPECT_EQ(view.speed, L"1x");
    EXPECT_EQ(dialog->GetSpeedFactor(), 1.0);
    EXPECT_EQ(view.entries, (Texts{L"<None>", L"Live|TEST|bench"}));
    EXPECT_EQ(view.chosen, 1U);
    EXPECT_EQ(view.frame.count, 4U);
}

TEST_F(Dialog, ListsSourcesOnlyAndFollowsTheirConfiguration)
{
    Add(L"Sink").source = false;
    Point& other = Add(L"Other");
    dialog->RefillPoints();
    EXPECT_EQ(view.entries, (Texts{L"<None>", L"Live|TEST|bench", L"Other|TEST|bench"}));

    other.path = L"elsewhere";
    router.SelectPoint(L"other");
    EXPECT_EQ(view.entries, (Texts{L"<None>", L"Live|TEST|bench", L"Other|TEST|elsewhere"})) << "at the same place";
    EXPECT_EQ(view.chosen, 2U);
    EXPECT_EQ(dialog->GetChosenPoint(), L"Other");

    router.NotifyConfiguration(L"Late|X|y");
    EXPECT_EQ(view.entries.back(), L"Late|X|y") << "an unknown point comes to the end";
    EXPECT_EQ(view.chosen, 2U) << "the choice is the router's";
    router.Clear();
    EXPECT_EQ(view.chosen, 0U);
    EXPECT_EQ(view.frame.number, 0U);
    EXPECT_EQ(view.time, L"");
}

TEST_F(Dialog, ChoosesThePointOfAnEntry)
{
    Point& other = Add(L"Other");
    other.SetChannels({L"Body"});
    other.Fill({0.0, 2.5});
    other.SetRecent(2);
    dialog->RefillPoints();
    log.clear();
    dialog->OnPointChosen(2);
    EXPECT_EQ(Taken(), (Log{"deselect Live", "select Other"}));
    EXPECT_EQ(router.GetActivePointName(0), L"Other");
    EXPECT_EQ(view.frame.number, 2U);
    EXPECT_EQ(view.frame.count, 2U);
    EXPECT_EQ(view.time, L"2.50");

    dialog->OnPointChosen(0);
    EXPECT_EQ(Taken(), (Log{"deselect Other", "disconnect Other"}));
    EXPECT_EQ(router.GetActivePoint(0), nullptr);
    EXPECT_EQ(view.chosen, 0U);
    EXPECT_FALSE(view.Enabled(firstFrame));

    dialog->OnPointChosen(7);
    EXPECT_EQ(view.chosen, 0U) << "there is no such entry";
    dialog->OnPointChosen(1);
    controller.PlayLoop();
    dialog->OnPointChosen(2);
    EXPECT_EQ(router.GetActivePointName(0), L"Live") << "the list is disabled while a replay plays";
    EXPECT_EQ(view.chosen, 1U) << "and shows what is";
}

TEST_F(Dialog, ShowsFrameAndTimeAtOnceWhileNothingRuns)
{
    controller.ShowFrame(L"Live", 3);
    EXPECT_EQ(view.frame.number, 3U);
    EXPECT_EQ(view.time, L"1.02");
    EXPECT_TRUE(view.Enabled(previousFrame));
    controller.GotoLast(L"Live");
    EXPECT_EQ(view.time, L"1.04");
    EXPECT_FALSE(view.Enabled(nextFrame));

    live.SetChannels({L"Body"}, {}, false);
    live.Fill({0, 0});
    controller.GotoFirst(L"Live");
    EXPECT_EQ(view.time, L"") << "no time stamps";
}

TEST_F(Dialog, FollowsARunOncePerTimerEvent)
{
    live.SetRecent(1);
    dialog->OnCommand(playLoop);
    EXPECT_TRUE(view.Checked(playLoop));
    const int before = view.updates;
    controller.Step();
    controller.Step();
    EXPECT_EQ(view.updates, before) << "no timer event yet";
    dialog->OnTimer();
    EXPECT_EQ(view.updates, before) << "shown with the next frame";
    clock.Advance(0.02);
    controller.Step();
    controller.Step();
    EXPECT_EQ(view.updates, before + 1);
    EXPECT_EQ(view.frame.number, 3U);
    EXPECT_EQ(view.time, L"1.02");
}

TEST_F(Dialog, TakesNoMemoryForTheFramesOfARun)
{
    if (!heap::CanCount())
        GTEST_SKIP() << "this build counts no allocations";
    controller.PlayLoop();
    const double time = 1.02;
    dialog->OnFrame(1, &time);
    heap::Count count;
    for (int i = 0; i < 100; ++i)
        dialog->OnFrame(i, &time);
    EXPECT_EQ(count.Stop(), 0);
}

TEST_F(Dialog, ShowsTheEndOfARunAtTheNextTimerEvent)
{
    live.SetRecent(2);
    EXPECT_EQ(UpdatesOfTick(), 0) << "nothing has run";
    controller.PlayLoop();
    EXPECT_EQ(UpdatesOfTick(), 0);
    controller.ResetPlayState(); // tells nobody
    EXPECT_TRUE(view.Checked(playLoop));
    EXPECT_EQ(UpdatesOfTick(), 1);
    EXPECT_FALSE(view.Checked(playLoop));
    EXPECT_EQ(UpdatesOfTick(), 0) << "once";

    controller.Start();
    EXPECT_TRUE(view.Enabled(stop));
    controller.Stop();
    EXPECT_EQ(UpdatesOfTick(), 1) << "a run shorter than the timer's period counts";
}

TEST_F(Dialog, EndsAPlayOnTheLastFrame)
{
    controller.GotoFirst(L"Live");
    dialog->OnCommand(playOnce);
    for (int i = 0; i < 5; ++i)
    {
        controller.Step();
        clock.Advance(0.02);
    }
    EXPECT_EQ(view.frame.number, 4U);
    EXPECT_FALSE(view.Enabled(playOnce));
    EXPECT_FALSE(view.Checked(playOnce));
    EXPECT_TRUE(view.Enabled(firstFrame));
    EXPECT_FALSE(view.Enabled(stopPlay));

    dialog->TogglePlay();
    EXPECT_EQ(controller.GetPlayState(), VtEPlayState::PlayOnce) << "from the end it starts over";
    EXPECT_EQ(router.GetRecent(L"Live"), 1UL);
    dialog->TogglePlay();
    EXPECT_FALSE(controller.HasPlayState());
    live.Fill({0.0});
    dialog->TogglePlay();
    EXPECT_FALSE(controller.HasPlayState()) << "a single frame can't be played";
}

TEST_F(Dialog, ChangesTheSpeedByTheTable)
{
    struct Step
    {
        std::int32_t change;
        bool taken;
        std::uint32_t position;
        const wchar_t* text;
        double factor;
    };
    const Step steps[] = {
        {1, true, 6, L"2x", 2.0},          {4, true, 10, L"32x", 32.0},       {1, false, 10, L"32x", 32.0},
        {-5, true, 5, L"1x", 1.0},         {-1, true, 4, L"1/2x", 0.5},       {-4, true, 0, L"1/32x", 0.03125},
        {-1, false, 0, L"1/32x", 0.03125}, {11, false, 0, L"1/32x", 0.03125}, {2, true, 2, L"1/8x", 0.125},
    };
    for (const Step& step : steps)
    {
        EXPECT_EQ(dialog->OnSpeedChange(step.change), step.taken) << step.change;
        EXPECT_EQ(view.position, step.position);
        EXPECT_EQ(view.speed, step.text);
        EXPECT_EQ(controller.GetSpeed(), step.factor);
    }
    controller.PlayLoop();
    EXPECT_FALSE(view.Enabled(speedControl));
    EXPECT_FALSE(dialog->OnSpeedChange(1)) << "disabled while playing";
    EXPECT_EQ(controller.GetSpeed(), 0.125);
}

TEST_F(Dialog, TakesAFrameNumberWhenTheEditIsLeftOrConfirmed)
{
    dialog->OnFrameNumberEdited(3);
    EXPECT_EQ(Taken(), Log{}) << "typing alone moves nothing";
    dialog->OnFrameNumberEntered();
    EXPECT_EQ(router.GetRecent(L"Live"), 3UL);
    router.ShowFrame(L"Live", 1);
    dialog->OnFrameNumberLeft();
    EXPECT_EQ(router.GetRecent(L"Live"), 1UL) << "Return has dealt with the number";

    dialog->OnFrameNumberEdited(2);
    dialog->OnFrameNumberLeft();
    EXPECT_EQ(router.GetRecent(L"Live"), 2UL);

    for (const auto& [typed, shown] : {std::pair{99U, 4U}, {0U, 1U}, {4294967295U, 4U}})
    {
        dialog->OnFrameNumberEdited(typed);
        dialog->OnFrameNumberEntered();
        EXPECT_EQ(view.frame.number, shown) << typed;
    }
    dialog->OnFrameNumberEdited(2);
    dialog->OnFrameNumberEdited(std::nullopt);
    dialog->OnFrameNumberLeft();
    EXPECT_EQ(view.frame.number, 4U) << "an emptied edit takes the cursor's number";
    live.StartBuffer();
    dialog->OnFrameNumberEdited(3);
    dialog->OnFrameNumberEntered();
    EXPECT_EQ(view.frame.number, 0U) << "back to the cursor, where there is no frame";
    EXPECT_FALSE(view.frame.canEnter);
    EXPECT_FALSE(view.frame.canSeek);
}

TEST_F(Dialog, CommitsATypedNumberBeforeACommand)
{
    dialog->OnFrameNumberEdited(2);
    dialog->OnCommand(nextFrame);
    EXPECT_EQ(view.frame.number, 3U);
}

TEST_F(Dialog, SpoolsWhileAButtonIsHeld)
{
    live.Fill({0, 1, 2, 3, 4, 5, 6, 7, 8, 9});
    live.SetRecent(2);
    dialog->OnSpeedChange(1); // a spool goes with the square of the factor: 4 data seconds in a second
    dialog->OnFrameNumberEdited(3);
    dialog->OnSpoolButton(spoolForward, true);
    EXPECT_EQ(controller.GetPlayState(), VtEPlayState::SpoolForward);
    EXPECT_TRUE(view.Checked(spoolForward));
    clock.Advance(1.0);
    controller.Step();
    EXPECT_EQ(view.frame.number, 7U) << "from the typed frame 3 on";
    dialog->OnSpoolButton(spoolForward, false);
    EXPECT_FALSE(controller.HasPlayState());
    EXPECT_EQ(view.frame.number, 7U);

    dialog->OnSpoolButton(spoolBack, true);
    EXPECT_EQ(controller.GetPlayState(), VtEPlayState::SpoolBackward);
    for (int i = 0; i < 3; ++i)
    {
        clock.Advance(2.0);
        controller.Step();
    }
    EXPECT_EQ(view.frame.number, 1U);
    EXPECT_FALSE(controller.HasPlayState()) << "ended at the first frame by itself";
    EXPECT_FALSE(view.Enabled(spoolBack));
    EXPECT_FALSE(view.Checked(spoolBack));
    dialog->OnSpoolButton(spoolBack, false);
    EXPECT_EQ(view.frame.number, 1U);
    dialog->OnSpoolButton(spoolBack, true);
    EXPECT_FALSE(controller.HasPlayState()) << "disabled on the first frame";
}

TEST_F(Dialog, StepsByAClickOnASpoolButton)
{
    live.SetRecent(2);
    dialog->OnSpoolButton(spoolForward, true);
    dialog->OnSpoolButton(spoolForward, false);
    EXPECT_EQ(view.frame.number, 3U);
    dialog->OnSpoolButton(spoolBack, true);
    dialog->OnSpoolButton(spoolBack, false);
    EXPECT_EQ(view.frame.number, 2U);

    controller.PlayLoop();
    dialog->OnSpoolButton(spoolBack, false);
    EXPECT_TRUE(controller.IsPlaying()) << "a stray release stops no replay";
}

TEST_F(Dialog, SeeksAlsoWhileAReplayPlays)
{
    live.Fill({0, 1, 2, 3, 4});
    dialog->SeekFrame(2);
    EXPECT_EQ(view.frame.number, 2U);
    EXPECT_FALSE(controller.HasPlayState());

    controller.PlayOnce();
    dialog->SeekFrame(4);
    EXPECT_EQ(controller.GetPlayState(), VtEPlayState::PlayOnce);
    clock.Advance(0.5);
    controller.Step();
    EXPECT_EQ(router.GetRecent(L"Live"), 4UL) << "goes on from there";
    EXPECT_TRUE(view.frame.canSeek);
    EXPECT_FALSE(view.frame.canEnter);
    controller.StopPlay();

    controller.Start();
    EXPECT_FALSE(view.frame.canSeek);
    dialog->SeekFrame(1);
    EXPECT_NE(router.GetRecent(L"Live"), 1UL) << "online there is no way back";
}

TEST_F(Dialog, KeepsStillBehindAHiddenPaneAndCatchesUp)
{
    Hide();
    const int before = view.updates;
    controller.ShowFrame(L"Live", 2);
    controller.Start();
    controller.Stop();
    controller.PlayLoop();
    controller.StopPlay();
    dialog->OnTimer();
    EXPECT_EQ(view.updates, before);
    Add(L"Other");
    router.SelectPoint(L"Other");
    EXPECT_EQ(view.chosen, 1U);
    router.LoadPlugins(); // drops the test's points
    EXPECT_EQ(view.entries, (Texts{L"<None>"})) << "the list is kept all the same";

    Point& back = Add(L"Back");
    back.SetChannels({L"Body"});
    back.Fill({0.0, 0.25});
    router.SelectPoint(L"Back");
    userInterface.shownPanes[6247] = true;
    dialog->OnShowWindow();
    EXPECT_EQ(view.entries, (Texts{L"<None>", L"Back|TEST|bench"}));
    EXPECT_EQ(view.chosen, 1U);
    EXPECT_EQ(view.frame.number, 2U);
    EXPECT_EQ(view.time, L"0.25");
}

TEST_F(Dialog, IgnoresThePlayStateOfAnotherPoint)
{
    VtCSimulationDataChangeObjectController listener(dialog.get());
    const int before = view.updates;
    listener.OnPlayStateChanged(L"Other", VtEPlayState::PlayLoop);
    listener.OnPlayStateChanged(L"", VtEPlayState::PlayLoop);
    listener.OnFrame(L"Live", nullptr, 7, nullptr);
    EXPECT_EQ(view.updates, before);
    listener.OnPlayStateChanged(L"LIVE", VtEPlayState::PlayLoop);
    EXPECT_EQ(view.updates, before + 1);
}

TEST_F(Dialog, LetsGoOfItsWindowAndItsRouter)
{
    dialog->OnDestroy();
    const int before = view.updates;
    controller.ShowFrame(L"Live", 2);
    dialog->OnTimer();
    EXPECT_EQ(view.updates, before);
    dialog->OnInitDialog(view);
    dialog.reset();
    EXPECT_TRUE(view.gone);
    const int after = view.updates;
    controller.ShowFrame(L"Live", 3);
    EXPECT_EQ(view.updates, after);
}

} // namespace
