#include <gtest/gtest.h>

#include <sys/stat.h>
#include <unistd.h>

#include "base/IniFile.h"
#include "hosts/common/FileStorage.h"
#include "hosts/common/HostTexts.h"
#include "tests/support/FakeHost.h"
#include "tests/support/TemporaryFolder.h"

namespace
{

struct Storage : testing::Test
{
    TemporaryFolder folder;
    fake::MessageService messages;
};

TEST_F(Storage, SettingsComeBackAsTheyWereKept)
{
    const auto file = folder.path / "new" / "settings.ini";
    hosts::FileSettings settings(file, messages);
    EXPECT_FALSE(settings.Load(L"Visualisation"));

    const host::SettingsNode node{L"Visualisation",
                                  {{L"MouseSensitivity", 7U},
                                   {L"RendererMode", 4294967295U},
                                   {L"FullscreenUseScreens", L"0"},
                                   {L"Title", L" \"\u00c4\\ = ;\u6c34\n[x]"}}};
    EXPECT_TRUE(settings.Store(node));
    EXPECT_TRUE(settings.Store({L"Other", {{L"Key", 1U}}}));
    const auto read = hosts::FileSettings(file, messages).Load(L"Visualisation");
    ASSERT_TRUE(read);
    EXPECT_EQ(read->entries, node.entries) << "order, types and every character";

    // Entries that a later node doesn't have are gone.
    EXPECT_TRUE(settings.Store({L"Visualisation", {{L"RendererMode", 0U}}}));
    EXPECT_EQ(settings.Load(L"Visualisation")->entries.size(), 1U);
    EXPECT_EQ(settings.Load(L"Other")->entries.size(), 1U);
    EXPECT_TRUE(messages.shown.empty());
}

struct BadFile
{
    const char* name;
    std::string content;
};

TEST_F(Storage, ADamagedFileIsToldAndLeftAsItIs)
{
    const BadFile files[] = {
        {"no section, no value", "[Visualisation]\nMouseSensitivity = 3\nwhat is this\n"},
        {"no name", "[Visualisation]\n= 3\n"},
        {"an open section", "[Visualisation\nMouseSensitivity = 3\n"},
        {"binary", std::string("[Visualisation]\nM = 3\0\1", 22)},
        {"another encoding", "[Visualisation]\nM = \xe4\n"},
    };
    for (const BadFile& bad : files)
    {
        SCOPED_TRACE(bad.name);
        messages.shown.clear();
        const auto file = folder.Write("settings.ini", bad.content);
        hosts::FileSettings settings(file, messages);
        EXPECT_FALSE(settings.Load(L"Visualisation"));
        EXPECT_FALSE(settings.Load(L"Visualisation"));
        ASSERT_EQ(messages.shown.size(), 1U) << "told once";
        EXPECT_EQ(messages.shown[0].number, hosts::messageDefaultsUsed);
        EXPECT_EQ(messages.shown[0].severity, host::Severity::warning);
        EXPECT_NE(messages.shown[0].first.find(file.wstring()), std::wstring::npos) << "names the file";
        EXPECT_FALSE(settings.Store({L"Visualisation", {{L"M", 1U}}}));
        EXPECT_EQ(messages.shown.back().number, hosts::messageNotStored);
        EXPECT_EQ(TemporaryFolder::Read(file), bad.content);
    }
    std::filesystem::create_directory(folder.path / "folder.ini");
    EXPECT_NE(base::IniFile(folder.path / "folder.ini").Error(), "");
    EXPECT_EQ(base::IniFile(folder.path / "missing.ini").Error(), "");
}

TEST_F(Storage, AHandWrittenFileKeepsItsComments)
{
    const auto file = folder.Write("c.ini", "; mine\n[Panoramic]\n# why\nMaxTracks = 3\nSimulationBufferFrames=5000\n");
    base::IniFile ini(file);
    hosts::FileConfiguration configuration(ini, messages);
    EXPECT_EQ(configuration.GetMaxTracks(), 3);
    EXPECT_EQ(configuration.GetSimulationBufferFrames(), 5000);
    configuration.SetSimulationBufferFrames(6000);
    configuration.SetTrackBufferFrames(7000);
    const std::string text = TemporaryFolder::Read(file);
    EXPECT_NE(text.find("; mine"), std::string::npos);
    EXPECT_NE(text.find("# why"), std::string::npos);
    base::IniFile again(file);
    hosts::FileConfiguration next(again, messages);
    EXPECT_EQ(next.GetSimulationBufferFrames(), 6000);
    EXPECT_EQ(next.GetTrackBufferFrames(), 7000);
    EXPECT_EQ(next.GetMaxTracks(), 3);
    EXPECT_TRUE(messages.shown.empty());
}

TEST_F(Storage, AnImpossibleNumberIsToldWithItsKeyAndTheDefaultStands)
{
    base::IniFile none(folder.path / "none.ini");
    const hosts::FileConfiguration defaults(none, messages);
    EXPECT_TRUE(messages.shown.empty());
    EXPECT_GE(defaults.GetSimulationBufferFrames(), 1000);
    EXPECT_GE(defaults.GetTrackBufferFrames(), 1000);

    base::IniFile ini(folder.Write("c.ini", "[Panoramic]\nMaxTracks = -1\nSimulationBufferFrames = 999\n"
                                            "TrackBufferFrames = many\n"));
    const hosts::FileConfiguration configuration(ini, messages);
    EXPECT_EQ(configuration.GetMaxTracks(), defaults.GetMaxTracks());
    EXPECT_EQ(configuration.GetSimulationBufferFrames(), defaults.GetSimulationBufferFrames());
    EXPECT_EQ(configuration.GetTrackBufferFrames(), defaults.GetTrackBufferFrames());
    ASSERT_EQ(messages.shown.size(), 3U);
    EXPECT_NE(messages.shown[1].first.find(L"SimulationBufferFrames"), std::wstring::npos);
    EXPECT_NE(messages.shown[1].first.find(L"c.ini"), std::wstring::npos);
}

TEST_F(Storage, AFolderThatCannotBeMadeIsToldAndTheValuesStand)
{
    folder.Write("file", "in the way");
    hosts::FileSettings settings(folder.path / "file" / "settings.ini", messages);
    EXPECT_FALSE(settings.Store({L"Visualisation", {{L"M", 1U}}}));
    ASSERT_EQ(messages.shown.size(), 1U);
    EXPECT_EQ(messages.shown[0].number, hosts::messageNotStored);
    base::IniFile nowhere{std::filesystem::path()};
    hosts::FileConfiguration configuration(nowhere, messages);
    configuration.SetTrackBufferFrames(2000);
    EXPECT_EQ(configuration.GetTrackBufferFrames(), 2000);
    EXPECT_EQ(messages.shown.back().number, hosts::messageNotStored);
}

struct Insertion
{
    std::uint32_t number;
    const wchar_t *first, *second, *text;
};

TEST_F(Storage, TextsTakeTheirInsertionsAndLoseNone)
{
    const hosts::IniTexts texts(folder.Write("t.ini", "[texts]\n1 = %1 and %2, %1\n2 = 100 %, %3\n3 = none\n"
                                                      "4 = a\\nb\n5 =\nx = 1\n"));
    EXPECT_EQ(texts.Error(), "");
    const Insertion cases[] = {
        {1, L"x", L"y", L"x and y, x"},
        {1, L"%2", L"y", L"%2 and y, %2"},
        {2, L"", L"", L"100 %, %3"},
        {3, L"x", L"y", L"none: x, y"},
        {3, L"", L"y", L"none: y"},
        {4, L"", L"", L"a\nb"},
        {5, L"", L"", L"5"},
        {99, L"x", L"", L"99: x"},
    };
    for (const Insertion& one : cases)
        EXPECT_EQ(hosts::IniTexts::Format(texts, one.number, one.first, one.second), one.text);
    EXPECT_EQ(texts.GetText(99), L"99");
    EXPECT_NE(hosts::IniTexts(folder.path / "none.ini").Error(), "");
    EXPECT_NE(hosts::IniTexts(folder.Write("u.ini", "[other]\n1 = a\n")).Error(), "");
}

} // namespace
