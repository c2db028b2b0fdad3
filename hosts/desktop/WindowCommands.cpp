#include "hosts/desktop/WindowCommands.h"

#include "hosts/desktop/MainWindow.h"

namespace desktop
{

const host::CommandTable<MainWindow>& GetWindowCommands()
{
    using enum host::CommandGroup;
    constexpr unsigned menu = host::inMenu;
    constexpr unsigned both = host::inMenu | host::onToolBar;
    const auto always = [](const MainWindow&, int) { return VtTCommandState{true}; };
    const auto withPanes = [](const MainWindow& window, int)
    { return VtTCommandState{window.GetViewArea() != nullptr}; };
    const auto move = [](MainWindow& window, int step) { window.MoveFocus(step); };

    static const host::CommandTable<MainWindow> table{
        // number, group, where, icon, shortcut, key | state | what it does
        {{commandNewScene, file, both, "new", "Ctrl+N"}, always, [](MainWindow& w, int) { w.GetFiles().New(); }},
        {{commandOpenScene, file, both, "open", "Ctrl+O"}, always, [](MainWindow& w, int) { w.GetFiles().Open(); }},
        {{commandOpenData, file, both, "open-data", "Ctrl+D"},
         always,
         [](MainWindow& w, int) { w.GetFiles().OpenData(); }},
        {{commandSave, file, both, "save", "Ctrl+S"}, withPanes, [](MainWindow& w, int) { w.GetFiles().Save(); }},
        {{commandSaveAs, file, menu, "save-as", "Ctrl+Shift+S"},
         withPanes,
         [](MainWindow& w, int) { w.GetFiles().SaveAs(); }},

        {{commandSettings, program, menu, "settings", "Ctrl+,"},
         always,
         [](MainWindow& w, int) { w.EditProgramSettings(); }},
        {{commandQuit, program, menu, "quit", "Ctrl+Q"}, always, [](MainWindow& w, int) { w.close(); }},

        {{commandNextPane, panes, menu, "", "F6"}, withPanes, move, 1},
        {{commandPreviousPane, panes, menu, "", "Shift+F6"}, withPanes, move, -1},

        {{commandPlayOrStop, frames, 0, "", "", "Space"},
         [](const MainWindow& w, int) { return VtTCommandState{w.CanTogglePlay()}; },
         [](MainWindow& w, int) { w.TogglePlay(); }},

        {{commandHelp, help, menu, "", "F1"}, always, [](MainWindow& w, int) { w.ShowHelp(); }},
    };
    return table;
}

} // namespace desktop
