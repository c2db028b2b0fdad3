// The tables of commands of all folders together: what a window makes its menus, keys and help from.
#include <filesystem>
#include <map>
#include <set>

#include <gtest/gtest.h>
#include <QAction>
#include <QKeySequence>
#include <QLineEdit>
#include <QMainWindow>
#include <QMenu>
#include <QPlainTextEdit>
#include <QPushButton>
#include <QTest>

#include "hosts/common/HostTexts.h"
#include "hosts/desktop/CommandActions.h"
#include "hosts/desktop/Icons.h"
#include "hosts/desktop/WindowCommands.h"
#include "render/ViewCommandsHandler.h"
#include "simdata/SimulationDataController.h"

namespace
{

std::vector<host::CommandLook> AllLooks()
{
    std::vector<host::CommandLook> looks;
    VtCVisualizationViewCommandsHandler::GetCommands().AddTo(looks);
    VtCSimulationDataController::GetCommands().AddTo(looks);
    desktop::GetWindowCommands().AddTo(looks);
    return looks;
}

bool IsListed(const host::CommandLook& look)
{
    return look.number >= ControllerCommand::firstSelect && look.number <= ControllerCommand::lastSelect;
}

TEST(CommandTables, TellCommandsApartByNumberNameAndKey)
{
    const hosts::IniTexts texts(std::filesystem::path(PANORAMIC_SHARE) / "texts" / "en.ini");
    std::set<std::uint32_t> numbers;
    std::set<std::wstring> names;
    std::map<QString, std::uint32_t> keys;
    for (const host::CommandLook& look : AllLooks())
    {
        SCOPED_TRACE(look.number);
        EXPECT_TRUE(numbers.insert(look.number).second) << "the number";
        for (const char* key : {look.shortcut, look.key})
            if (*key)
            {
                const QKeySequence sequence(key);
                EXPECT_EQ(sequence.toString(QKeySequence::PortableText), key) << "as the toolkit reads it";
                EXPECT_TRUE(keys.emplace(sequence.toString(), look.number).second)
                    << key << " is taken by " << keys[sequence.toString()];
            }
        EXPECT_NE(desktop::MakeIcon(look.icon).isNull(), *look.icon != '\0') << look.icon;
        if (look.group == host::CommandGroup::none || IsListed(look))
            continue;
        const std::wstring text = texts.GetText(look.GetText());
        const std::size_t bar = text.find(L'|');
        ASSERT_NE(bar, std::wstring::npos) << "a name and what it does";
        EXPECT_GT(bar, 0U);
        EXPECT_GT(text.size(), bar + 1);
        EXPECT_TRUE(names.insert(text.substr(0, bar)).second) << "the name";
    }
}

// In one menu two entries with the same marked letter would need it twice.
TEST(CommandTables, MarkEachLetterOnceInAMenu)
{
    using enum host::CommandGroup;
    const hosts::IniTexts texts(std::filesystem::path(PANORAMIC_SHARE) / "texts" / "en.ini");
    for (const std::set<host::CommandGroup>& menu :
         {std::set{file, program}, std::set{layout, renderMode, camera, panes}, std::set{simulation, frames, data}})
    {
        std::set<wchar_t> letters;
        for (const host::CommandLook& look : AllLooks())
        {
            const std::wstring text = texts.GetText(look.GetText());
            const std::size_t mark = text.find(L'&');
            if (!menu.count(look.group) || !(look.traits & host::inMenu) || IsListed(look) ||
                mark == std::wstring::npos)
                continue;
            EXPECT_TRUE(letters.insert(std::towlower(static_cast<wint_t>(text[mark + 1]))).second)
                << look.number << " shares its letter";
        }
    }
}

/// A target that counts what it is told to do.
class Counter : public host::CommandTarget
{
public:
    std::vector<host::CommandLook> GetCommands() const override
    {
        using enum host::CommandGroup;
        return {{1, frames, host::inMenu | host::hasCheck, "play", "F5", "Space", 38751},
                {2, frames, host::inMenu, "", "Ctrl+Right", "Right", 38748},
                {3, data, 0, "", "Ctrl+E", "", 38743}};
    }
    std::optional<VtTCommandState> GetMenuState(std::uint32_t command) const override
    {
        return VtTCommandState{command != forbidden, command == 1};
    }
    bool OnCmdMsg(std::uint32_t command) override
    {
        ++done[command];
        return true;
    }

    std::map<std::uint32_t, int> done;
    std::uint32_t forbidden = 0;
};

class Actions : public testing::Test
{
protected:
    Actions()
    {
        window.setCentralWidget(pane);
        pane->setFocusPolicy(Qt::StrongFocus);
        window.show();
        window.activateWindow();
        EXPECT_TRUE(QTest::qWaitForWindowActive(&window));
        pane->setFocus();
    }

    hosts::IniTexts texts{std::filesystem::path(PANORAMIC_SHARE) / "texts" / "en.ini"};
    Counter target;
    int executed = 0;
    QMainWindow window;
    QWidget* pane = new QWidget(&window);
    desktop::CommandActions actions{{&target}, texts, window, [this] { ++executed; }};
};

TEST_F(Actions, HaveTheirKeysInTheWholeWindowWithoutAMenu)
{
    actions.Refresh();
    QTest::keyClick(pane, Qt::Key_Right);
    QTest::keyClick(pane, Qt::Key_Right, Qt::ControlModifier);
    QTest::keyClick(pane, Qt::Key_Space);
    QTest::keyClick(pane, Qt::Key_E, Qt::ControlModifier);
    EXPECT_EQ(target.done, (std::map<std::uint32_t, int>{{1, 1}, {2, 2}, {3, 1}}));
    EXPECT_EQ(executed, 4);
    target.forbidden = 2;
    actions.Refresh();
    QTest::keyClick(pane, Qt::Key_Right);
    EXPECT_EQ(target.done[2], 2) << "disabled";
    EXPECT_EQ(actions.Get(2)->toolTip(), "Next frame (Ctrl+Right, Right)");
    EXPECT_TRUE(actions.Get(1)->isChecked());
}

TEST_F(Actions, LeaveBareKeysToFields)
{
    auto* reading = new QPlainTextEdit(&window);
    reading->setReadOnly(true);
    auto* line = new QLineEdit(&window);
    auto* button = new QPushButton(&window);
    for (QWidget* widget : {static_cast<QWidget*>(reading), static_cast<QWidget*>(line), static_cast<QWidget*>(button)})
    {
        widget->show();
        widget->setFocus();
        QTest::keyClick(widget, Qt::Key_Space);
        if (widget != button)
            QTest::keyClick(widget, Qt::Key_Right);
    }
    EXPECT_TRUE(target.done.empty());
    EXPECT_EQ(line->text(), " ");
    QTest::keyClick(line, Qt::Key_F5);
    EXPECT_EQ(target.done[1], 1) << "no field has a use for this one";
    delete line; // wherever the focus goes now
    pane->setFocus();
    QTest::keyClick(pane, Qt::Key_Right);
    EXPECT_EQ(target.done[2], 1) << "the keys are back";
}

TEST_F(Actions, MakeMenusByGroupsAndHelpOfAll)
{
    QMenu menu;
    actions.AddGroups(menu, {host::CommandGroup::frames, host::CommandGroup::data}, host::inMenu);
    EXPECT_EQ(menu.actions(), (QList<QAction*>{actions.Get(1), actions.Get(2)}));
    const QString help = actions.MakeHelp({host::CommandGroup::frames, host::CommandGroup::data});
    for (const char* told : {"Save motion data", "Ctrl+E", "Go one frame on", "Ctrl+Right, Right"})
        EXPECT_TRUE(help.contains(told)) << told;
    EXPECT_FALSE(help.contains('&'));
}

} // namespace
