#pragma once

#include <string>
#include <vector>

namespace host
{
class Clock;
class Configuration;
class MessageHandler;
class Progress;
class Questions;
class Texts;
class UserInterface;
class Variables;
} // namespace host

class VtIActiveScene;
class VtINavigatorState;

/// What the simulation data path needs from outside. All of it outlives the controller.
struct VtTSimulationServices
{
    host::Clock& clock;
    host::MessageHandler& messages;
    host::Texts& texts;
    VtIActiveScene& activeScene;
    std::vector<std::wstring> pluginFolders;      ///< inner form; the first one that has a module gives it
    host::Variables* variables = nullptr;         ///< null: no status line, no running indicator
    host::Progress* progress = nullptr;           ///< null: no progress is shown
    host::UserInterface* userInterface = nullptr; ///< null: no wait cursor
    host::Configuration* configuration = nullptr; ///< null: buffer sizes by default, and not kept
    host::Questions* questions = nullptr;         ///< null: nobody to ask for a file name
    VtINavigatorState* navigator = nullptr;       ///< null: there is no current item
};
