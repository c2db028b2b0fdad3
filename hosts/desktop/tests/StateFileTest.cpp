#include "hosts/desktop/StateFile.h"

#include <fstream>

#include <gtest/gtest.h>

#include "tests/support/FakeHost.h"
#include "tests/support/TemporaryFolder.h"

namespace
{

class State : public testing::Test
{
protected:
    TemporaryFolder folder;
    std::filesystem::path file = folder.path / "panoramic" / "desktop.ini";
    fake::MessageService messages;
    desktop::StateFile state{file, messages};
};

TEST_F(State, KeepsTheEightNewestFilesEachOnce)
{
    for (int i = 1; i <= 9; ++i)
        state.AddRecentFile("/scenes/" + std::to_string(i) + ".xml");
    state.AddRecentFile("/scenes/5.xml");

    const std::vector<std::string> expected = {"/scenes/5.xml", "/scenes/9.xml", "/scenes/8.xml", "/scenes/7.xml",
                                               "/scenes/6.xml", "/scenes/4.xml", "/scenes/3.xml", "/scenes/2.xml"};
    EXPECT_EQ(state.GetRecentFiles(), expected);
    EXPECT_EQ(desktop::StateFile(file, messages).GetRecentFiles(), expected) << "the next session has them";

    state.ClearRecentFiles();
    EXPECT_TRUE(state.GetRecentFiles().empty());
}

TEST_F(State, KeepsWhatAnotherProgramOfTheUserHasWritten)
{
    desktop::StateFile other(file, messages);
    state.Set("Window", "State", "AAEC/w==");
    other.Set("Desktop", "Paced", "0");
    EXPECT_EQ(state.Get("Desktop", "Paced"), "0");
    EXPECT_EQ(other.Get("Window", "State"), "AAEC/w==");
}

TEST_F(State, LeavesADamagedFileAloneAndSaysSoOnce)
{
    std::filesystem::create_directories(file.parent_path());
    std::ofstream(file) << "[Window]\nhalf a li";
    const std::string before = TemporaryFolder::Read(file);
    state.Set("Window", "State", "AAEC");
    state.AddRecentFile("/scenes/1.xml");
    EXPECT_EQ(TemporaryFolder::Read(file), before);
    ASSERT_EQ(messages.shown.size(), 1U);
    EXPECT_FALSE(messages.shown[0].interrupts);
}

TEST_F(State, WorksWithoutAHome)
{
    desktop::StateFile homeless({}, messages);
    homeless.Set("Window", "State", "AAEC");
    EXPECT_EQ(homeless.Get("Window", "State"), "");
}

} // namespace
