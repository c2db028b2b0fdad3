#pragma once

#include <cstdint>
#include <functional>
#include <initializer_list>
#include <map>
#include <vector>

#include <QString>

#include "host/Commands.h"

class QAction;
class QWidget;

namespace host
{
class Texts;
}

namespace desktop
{

/// The commands as actions of the toolkit: one for each, which menus, tool bars, docks and keys share. Each shows what
/// its command's owner tells, and has it carried out.
///
///     CommandActions actions({&app, &window}, texts, window, [] {});
///     actions.AddGroups(*menu, {host::CommandGroup::layout, host::CommandGroup::camera}, host::inMenu);
///
/// Shortcuts work in the whole window. Bare keys do except where the widget with the focus has a use for them itself:
/// in text edits, lists and number fields all of them, on a button the one that presses it.
class CommandActions
{
public:
    /// The actions are those of `window`. `executed` is called behind every command. All outlive this.
    CommandActions(std::vector<host::CommandTarget*> commandTargets, const host::Texts& displayTexts,
                   QWidget& actionWindow, std::function<void()> executed);
    ~CommandActions();
    CommandActions(const CommandActions&) = delete;
    CommandActions& operator=(const CommandActions&) = delete;

    /// The action of a command that one of the targets has.
    QAction* Get(std::uint32_t command) const { return entries.at(command).action; }

    /// Appends the commands of the groups that have the trait, a line between one group and the next.
    void AddGroups(QWidget& bar, std::initializer_list<host::CommandGroup> groups, host::CommandTraits trait) const;

    /// Carries a command out as its action would.
    void Execute(std::uint32_t command);

    /// Shows a state that came from the command's owner.
    void Show(std::uint32_t command, const VtTCommandState& state) const;

    /// Asks for all states.
    void Refresh() const;

    /// The commands of the groups as rows of an HTML table: name, keys, what it does.
    QString MakeHelp(std::initializer_list<host::CommandGroup> groups) const;

private:
    struct Entry
    {
        host::CommandLook look;
        host::CommandTarget* target = nullptr;
        QAction* action = nullptr;
    };

    QAction* Make(const host::CommandLook& look);
    void FollowFocus(const QWidget* focus) const;

    const host::Texts& texts;
    QWidget& window;
    std::function<void()> onExecuted;
    std::vector<std::uint32_t> order; ///< of the tables
    std::map<std::uint32_t, Entry> entries;
};

} // namespace desktop
