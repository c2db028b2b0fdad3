#pragma once

#include <cstdint>

#include "host/Commands.h"

namespace desktop
{

class MainWindow;

/// The commands of the program itself, beside those of the component.
enum WindowCommand : std::uint32_t
{
    commandNewScene = 9134,
    commandOpenScene = 9135,
    commandOpenData = 9136,
    commandSave = 9138,
    commandSaveAs = 9139,
    commandQuit = 9140,
    commandSettings = 9165,
    commandPlayOrStop = 9190,
    commandNextPane = 9191,
    commandPreviousPane = 9192,
    commandHelp = 9193,
};

const host::CommandTable<MainWindow>& GetWindowCommands();

} // namespace desktop
