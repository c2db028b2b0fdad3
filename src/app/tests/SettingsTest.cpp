#include <gtest/gtest.h>

#include "app/VisualizationPPGSettings.h"
#include "tests/support/FakeHost.h"

namespace
{

struct FakeEffects : VtISettingsEffects
{
    void SetMouseSensitivity(std::uint32_t value) override { sensitivity = value; }
    void SetRendererMode(std::uint32_t value) override { mode = value; }

    std::uint32_t sensitivity = 0;
    std::uint32_t mode = 0;
};

using Entries = decltype(host::SettingsNode::entries);

std::wstring Keys(const host::SettingsNode& node)
{
    std::wstring keys;
    for (const auto& [key, value] : node.entries)
        keys += key + L" ";
    return keys;
}

TEST(Settings, StoredNodeKeepsItsOrderAndLeavesTheScreensOutWhileAllAreUsed)
{
    FakeEffects effects;
    VtCVisualizationPPGSettings settings(effects);
    EXPECT_EQ(settings.ToNode().name, L"Visualisation");
    EXPECT_EQ(Keys(settings.ToNode()), L"MouseSensitivity RendererMode FullscreenUseAll ");
    settings.PutFullscreenUseAll(false);
    EXPECT_EQ(Keys(settings.ToNode()), L"MouseSensitivity RendererMode FullscreenUseAll FullscreenUseScreens ");
    EXPECT_EQ(settings.ToNode().Find<std::wstring>(L"FullscreenUseScreens"), L"0");
    EXPECT_EQ(settings.ToNode().Find<std::uint32_t>(L"MouseSensitivity"), 5U);
}

TEST(Settings, ReadingTakesWhatIsInRangeAndHasNoEffect)
{
    struct Case
    {
        const char* name;
        Entries entries;
        std::uint32_t sensitivity, mode;
        bool useAll;
        std::wstring screens;
    };
    const Case cases[] = {
        {"all of them",
         {{L"MouseSensitivity", 9U},
          {L"RendererMode", 1U},
          {L"FullscreenUseAll", 0U},
          {L"FullscreenUseScreens", L"0,2"}},
         9,
         1,
         false,
         L"0,2"},
        {"nothing", {}, 5, 0, true, L"0"},
        {"a mode above 1", {{L"RendererMode", 2U}}, 5, 0, true, L"0"},
        {"any number above 0 is true", {{L"FullscreenUseAll", 7U}}, 5, 0, true, L"0"},
        {"texts where numbers belong", {{L"MouseSensitivity", L"9"}, {L"FullscreenUseScreens", 1U}}, 5, 0, true, L"0"},
    };
    for (const Case& one : cases)
    {
        SCOPED_TRACE(one.name);
        FakeEffects effects;
        VtCVisualizationPPGSettings settings(effects);
        settings.FromNode({L"Visualisation", one.entries});
        EXPECT_EQ(settings.GetMouseSensitivity(), one.sensitivity);
        EXPECT_EQ(settings.GetRendererMode(), one.mode);
        EXPECT_EQ(settings.GetFullscreenUseAll(), one.useAll);
        EXPECT_EQ(settings.GetFullscreenUseScreens(), one.screens);
        EXPECT_EQ(effects.sensitivity, 0U);
        EXPECT_EQ(effects.mode, 0U);
    }
    FakeEffects effects;
    VtCVisualizationPPGSettings settings(effects);
    settings.PutRendererMode(1);
    settings.FromNode({L"Visualisation", {{L"RendererMode", 2U}}});
    EXPECT_EQ(settings.GetRendererMode(), 1U) << "the earlier mode stays";
}

TEST(Settings, APropertyTakesEffectAtOnceAndIsStoredOnce)
{
    FakeEffects effects;
    fake::Settings stored;
    VtCVisualizationPPGSettings settings(effects);
    EXPECT_TRUE(settings.StoreChanges(stored));
    EXPECT_TRUE(stored.nodes.empty()) << "nothing was set, so nothing is written";

    settings.PutMouseSensitivity(8);
    settings.PutRendererMode(2);
    EXPECT_EQ(effects.sensitivity, 8U);
    EXPECT_EQ(effects.mode, 2U);
    EXPECT_TRUE(settings.StoreChanges(stored));
    VtCVisualizationPPGSettings next(effects);
    next.Load(stored);
    EXPECT_EQ(next.GetMouseSensitivity(), 8U);
    EXPECT_EQ(next.GetRendererMode(), 0U) << "the number is stored, and not taken back";
}

} // namespace
