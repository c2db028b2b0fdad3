#pragma once

#include <algorithm>
#include <cstdint>
#include <initializer_list>
#include <optional>
#include <string>
#include <vector>

/// What a button or menu entry of a command shows.
struct VtTCommandState
{
    bool enabled = false;
    bool checked = false;
    std::wstring text{}; ///< instead of the command's own, when that hangs on what there is; "&" stands for itself
};

namespace host
{

/// Commands that stand together in menus, tool bars and the help, in the order of these.
enum class CommandGroup
{
    none, ///< shown nowhere: only asked for, and carried out, by number
    file,
    program,
    layout,
    renderMode,
    camera,
    panes,
    source,
    simulation,
    frames,
    data,
    help,
};

/// Where a command shows, and how; a sum of these.
enum CommandTraits : unsigned
{
    inMenu = 1,
    onToolBar = 2,
    hasCheck = 4,
};

/// What users meet of a command: the same in menus, tool bars, docks, tips and the help, which are all made from it.
struct CommandLook
{
    std::uint32_t number = 0;
    CommandGroup group = CommandGroup::none;
    unsigned traits = 0;
    const char* icon = "";     ///< a name of the host's icons
    const char* shortcut = ""; ///< "Ctrl+1"
    const char* key = "";      ///< a bare key for it as well: "Space"; a field that has the focus keeps it for itself
    std::uint32_t text = 0;    ///< of "label|what it does" among the texts; 0: the number of the command

    std::uint32_t GetText() const { return text != 0 ? text : number; }
};

/// A row of a table of commands: its look, when it can be carried out, and what it does.
///
/// `Subject` is what the state is read from. `value` tells rows of the same functions apart: the layout, the place in a
/// list. Asking for the state acts on nothing. Without `execute` it is a control, whose state alone is asked.
template <class Owner, class Subject = Owner>
struct Command
{
    CommandLook look;
    VtTCommandState (*state)(const Subject& subject, int value) = nullptr;
    void (*execute)(Owner& owner, int value) = nullptr;
    int value = 0;
};

/// The commands of a class, each in one row:
///
///     const host::CommandTable<Lamp> commands{
///         {{501, CommandGroup::file, inMenu | hasCheck, "lamp", "Ctrl+L"},
///          [](const Lamp& lamp, int) { return VtTCommandState{lamp.HasPower(), lamp.IsLit()}; },
///          [](Lamp& lamp, int) { lamp.Toggle(); }},
///     };
///     commands.Execute(lamp, lamp, 501);
///
/// A new row is all that a new command needs, with its text under its number.
template <class Owner, class Subject = Owner>
class CommandTable
{
public:
    CommandTable(std::initializer_list<Command<Owner, Subject>> commands) : rows(commands) {}

    const Command<Owner, Subject>* Find(std::uint32_t number) const
    {
        const auto at =
            std::find_if(rows.begin(), rows.end(), [number](const auto& row) { return row.look.number == number; });
        return at == rows.end() ? nullptr : &*at;
    }

    /// Nothing for a number that isn't a command of this table.
    std::optional<VtTCommandState> GetState(const Subject& subject, std::uint32_t number) const
    {
        const Command<Owner, Subject>* row = Find(number);
        return row && row->execute ? std::optional(row->state(subject, row->value)) : std::nullopt;
    }

    /// Carries the command out if its state is enabled. False for a number that isn't a command of this table.
    bool Execute(Owner& owner, const Subject& subject, std::uint32_t number) const
    {
        const Command<Owner, Subject>* row = Find(number);
        if (!row || !row->execute)
            return false;
        if (row->state(subject, row->value).enabled)
            row->execute(owner, row->value);
        return true;
    }

    /// Appends how the rows look.
    void AddTo(std::vector<CommandLook>& looks) const
    {
        for (const Command<Owner, Subject>& row : rows)
            looks.push_back(row.look);
    }

private:
    std::vector<Command<Owner, Subject>> rows;
};

/// Who carries out commands and tells their states: the component for its own, the program around it for others.
class CommandTarget
{
public:
    virtual ~CommandTarget() = default;

    /// In the order of menus and tool bars, within each group.
    virtual std::vector<CommandLook> GetCommands() const = 0;

    /// How the command shows now; nothing for a number that isn't one of these commands. Acts on nothing.
    virtual std::optional<VtTCommandState> GetMenuState(std::uint32_t command) const = 0;

    /// Carries the command out if it is enabled. False for a number that isn't one of these commands.
    virtual bool OnCmdMsg(std::uint32_t command) = 0;
};

} // namespace host
