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

class VtCScene3D;
class VtIInstrumentFeed;

/// The scene that data go to. The application object implements it, since it knows the active document.
class VtIActiveScene
{
public:
    virtual ~VtIActiveScene() = default;

    /// Null while no document with a scene is open.
    virtual VtCScene3D* GetActiveScene() const = 0;

    /// The instruments of that scene, null without a scene or without instruments.
    virtual VtIInstrumentFeed* GetActiveInstruments() const = 0;
};

/// The object tree as the simulation sees it. The navigator implements it.
class VtINavigatorState
{
public:
    virtual ~VtINavigatorState() = default;

    /// Is the current item that of a track?
    virtual bool IsTrackCurrent() const = 0;
};

/// Lets the user change the settings of the controller and of the data points. The layer of the dialogs implements it
/// and gives itself to the controller.
class VtICustomizeSheet
{
public:
    virtual ~VtICustomizeSheet() = default;

    /// Is there somebody to show sheets?
    virtual bool CanCustomize() const = 0;

    /// The sheet with all pages: the controller's, then those of the data points.
    virtual void Customize() = 0;

    /// Has the point of that name settings to show? Asks the point, so not for every frame.
    virtual bool CanCustomizePoint(const std::wstring& name) const = 0;

    /// One point alone: a question for the file of the point "File", its own page for any other.
    virtual void CustomizePoint(const std::wstring& name) = 0;
};

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
