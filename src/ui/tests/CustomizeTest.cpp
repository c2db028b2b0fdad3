#include "base/Text.h"
#include "ui/SimulationDataCustomizePropertyPage.h"
#include "ui/tests/DialogFixture.h"

using namespace simtest;
using namespace ControllerCommand;

namespace
{

/// A source with settings of its own: OK gives it another path.
class SettingsPoint : public Point
{
public:
    using Point::Point;

    SimulationDataPoints::VtCSettingsPage* CreatePropertyPage() override;

    std::wstring pathOfPage = L"set";
    int livePages = 0;
};

class SettingsPage : public SimulationDataPoints::VtCSettingsPage
{
public:
    explicit SettingsPage(SettingsPoint& owner) : point(owner) { ++point.livePages; }
    ~SettingsPage() override { --point.livePages; }

    std::wstring GetTitle() const override { return point.GetName(); }
    std::vector<SimulationDataPoints::VtTSettingsField> GetFields() const override { return {}; }
    void OnFieldChanged(std::size_t, double) override {}
    void OnOK() override { point.path = point.pathOfPage; }

private:
    SettingsPoint& point;
};

SimulationDataPoints::VtCSettingsPage* SettingsPoint::CreatePropertyPage()
{
    return new SettingsPage(*this);
}

class Customize : public uitest::DialogTest
{
protected:
    SettingsPoint& AddWithSettings(const std::wstring& name)
    {
        auto* point = new SettingsPoint(name, &log);
        router.AddPoint(VtTDataPointPtr(point));
        dialog->RefillPoints();
        log.clear();
        return *point;
    }

    Listener listener{log};
    using Titles = std::vector<std::wstring>;
};

TEST_F(Customize, SharesTheBufferedFramesBetweenRunAndTracks)
{
    VtCSimulationDataCustomizePropertyPage page(controller, texts, &messageService, 7);
    struct Edit
    {
        double value;
        double run, tracks;
    };
    // 10000 of the run and 20000 of the tracks: a total of 30000.
    const Edit edits[] = {
        {29000, 29000, 1000}, {29001, 29000, 1000}, {1000, 1000, 29000},   {999, 1000, 29000},
        {-1, 1000, 29000},    {1e300, 1000, 29000}, {12345, 12345, 17655},
    };
    for (const Edit& edit : edits)
    {
        page.OnFieldChanged(0, edit.value);
        const auto fields = page.GetFields();
        ASSERT_EQ(fields.size(), 3U);
        EXPECT_EQ(fields[0].value, edit.run) << edit.value;
        EXPECT_EQ(fields[1].value, edit.tracks) << edit.value;
        EXPECT_EQ(fields[2].value, 7.0);
        EXPECT_EQ(fields[0].minimum, 1000.0);
        EXPECT_EQ(fields[0].maximum, 29000.0);
    }
    page.OnFieldChanged(1, 5000);
    EXPECT_EQ(page.GetSimulationFrames(), 12345) << "the other fields only show";
    EXPECT_EQ(configuration.simulationBufferFrames, 10000) << "nothing before OK";

    page.OnOK();
    EXPECT_EQ(configuration.simulationBufferFrames, 12345);
    EXPECT_EQ(configuration.trackBufferFrames, 17655);
    ASSERT_EQ(messageService.shown.size(), 1U);
    EXPECT_EQ(messageService.shown[0].title, L"6893");
    EXPECT_EQ(messageService.shown[0].text, L"6894");
    EXPECT_EQ(messageService.shown[0].severity, host::Severity::information);

    VtCSimulationDataCustomizePropertyPage(controller, texts, &messageService).OnOK();
    EXPECT_EQ(messageService.shown.size(), 1U) << "nothing changed";
}

TEST_F(Customize, LeavesATotalTooSmallToShareAlone)
{
    configuration.simulationBufferFrames = 1000;
    configuration.trackBufferFrames = 0;
    VtCSimulationDataController other(Make());
    VtCSimulationDataCustomizePropertyPage page(other, texts, nullptr);
    page.SetSimulationFrames(1000);
    page.SetSimulationFrames(0);
    EXPECT_EQ(page.GetSimulationFrames(), 1000);
    EXPECT_FALSE(page.GetFields()[0].editable);
}

TEST_F(Customize, ShowsAPageForEachSourceThatHasOneAndOpensOnTheActive)
{
    AddWithSettings(L"One");
    AddWithSettings(L"Output").source = false;
    AddWithSettings(L"Two");
    struct Case
    {
        const wchar_t* active;
        std::size_t start;
    };
    for (const Case& c : {Case{L"Two", 2}, {L"One", 1}, {L"Live", 0}, {L"", 0}})
    {
        controller.ChoosePoint(c.active);
        EXPECT_TRUE(controller.OnCmdMsg(customize));
        EXPECT_EQ(sheets.titles, (Titles{L"9180", L"One", L"Two"}));
        EXPECT_EQ(sheets.start, c.start) << base::Utf8(c.active);
    }
}

TEST_F(Customize, TellsAllPointsAndSelectsTheActiveOneAgain)
{
    SettingsPoint& one = AddWithSettings(L"One");
    one.Say(L"old news");
    controller.ChoosePoint(L"One");
    router.AddChangeObject(&listener);
    log.clear();
    controller.OnCmdMsg(customize);
    EXPECT_EQ(Taken(), (Log{"selected Live|TEST|bench", "selected One|TEST|set", "selected One|TEST|set"}));
    EXPECT_EQ(view.chosen, 2U);
    EXPECT_EQ(view.entries[2], L"One|TEST|set");
    EXPECT_EQ(router.GetActivePointName(0), L"One");
    EXPECT_EQ(one.livePages, 0);
    EXPECT_TRUE(messages.stacks.empty()) << "messages from before the sheet are not shown after it";

    router.Clear();
    log.clear();
    controller.OnCmdMsg(customize);
    EXPECT_EQ(Taken(), (Log{"selected Live|TEST|bench", "selected One|TEST|set", "cleared "}));
    EXPECT_EQ(view.chosen, 0U);
    router.RemoveChangeObject(&listener);
}

TEST_F(Customize, ChangesNothingWhenCancelled)
{
    SettingsPoint& one = AddWithSettings(L"One");
    router.AddChangeObject(&listener);
    log.clear();
    sheets.confirm = false;
    sheets.edit = 5000;
    controller.OnCmdMsg(customize);
    EXPECT_EQ(sheets.shown, 1);
    EXPECT_EQ(Taken(), Log{});
    EXPECT_EQ(one.path, L"bench");
    EXPECT_EQ(configuration.simulationBufferFrames, 10000);
    router.RemoveChangeObject(&listener);
}

TEST_F(Customize, IsDisabledWhileSomethingRunsOrNobodyCanShowIt)
{
    EXPECT_TRUE(controller.GetMenuState(customize)->enabled);
    controller.PlayLoop();
    EXPECT_TRUE(controller.OnCmdMsg(customize)) << "the controller's all the same";
    EXPECT_FALSE(view.Enabled(customize));
    controller.StopPlay();
    controller.Start();
    controller.OnCmdMsg(customize);
    EXPECT_EQ(sheets.shown, 0);
    controller.Stop();
    {
        const VtCSimulationDataCustomizeSheet mute(controller, {texts});
        EXPECT_FALSE(controller.GetMenuState(customize)->enabled);
    }
    EXPECT_TRUE(controller.OnCmdMsg(customize)) << "and nobody is there any more";
    EXPECT_EQ(sheets.shown, 0);
}

TEST_F(Customize, ShowsTheOwnPageOfTheChosenPoint)
{
    EXPECT_FALSE(view.Enabled(customizePoint)) << "Live has no page";
    dialog->OnCustomizePoint();
    EXPECT_EQ(sheets.shown, 0);

    SettingsPoint& one = AddWithSettings(L"One");
    dialog->OnPointChosen(2);
    EXPECT_TRUE(view.Enabled(customizePoint));
    sheets.confirm = false;
    dialog->OnCustomizePoint();
    EXPECT_EQ(sheets.title, L"6903");
    EXPECT_EQ(sheets.titles, (Titles{L"One"}));
    EXPECT_EQ(view.entries[2], L"One|TEST|bench");
    sheets.confirm = true;
    dialog->OnCustomizePoint();
    EXPECT_EQ(view.entries[2], L"One|TEST|set");
    EXPECT_EQ(one.livePages, 0);
    controller.PlayLoop();
    dialog->UpdateControls();
    EXPECT_FALSE(view.Enabled(customizePoint));
}

TEST_F(Customize, AsksForTheFileOfTheFilePoint)
{
    Point& file = Add(L"File");
    file.SetChannels({L"Body"});
    file.Fill({0.0});
    dialog->RefillPoints();
    dialog->OnPointChosen(2);
    ASSERT_TRUE(view.Enabled(customizePoint));
    dialog->OnCustomizePoint();
    ASSERT_EQ(questions.asked.size(), 1U);
    EXPECT_EQ(questions.asked[0].filter, L"Motion Data file (*.mdf)|*.mdf||");
    EXPECT_EQ(file.path, L"bench") << "declined";
    questions.answer = L"runs\\lap.mdf";
    dialog->OnCustomizePoint();
    EXPECT_EQ(view.entries[2], L"File|MDF|runs\\lap.mdf");
    EXPECT_EQ(view.chosen, 2U);
    EXPECT_EQ(sheets.shown, 0);
}

} // namespace
