#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace host
{

class IdleSource;

/// States of a main window, by the host's numbers.
inline constexpr std::int32_t windowNormal = 1;
inline constexpr std::int32_t windowMinimised = 2;

/// The host's main window.
class MainWindow
{
public:
    virtual ~MainWindow() = default;

    /// `windowNormal` or `windowMinimised`. Throws `InterfaceError` when the window can't be asked.
    virtual std::int32_t GetWindowState() const = 0;
    virtual void SetWindowState(std::int32_t state) = 0;

    /// Takes the window off the screen while windows over whole screens show the scene, and brings it back. A hidden
    /// window isn't minimised: frames go on.
    virtual void Hide() = 0;
    virtual void ShowMaximised() = 0;
};

/// Values by name that the host shows or follows: the texts of the status line, switches of its behaviour.
class Variables
{
public:
    virtual ~Variables() = default;

    virtual void SetText(const std::wstring& name, const std::wstring& value) = 0;
    virtual void SetBool(const std::wstring& name, bool value) = 0;

    /// Null when the host raises no idle events.
    virtual IdleSource* GetIdleSource() = 0;
};

/// Fills a drop-down of a tool bar at the moment it opens.
class ToolBarEvents
{
public:
    virtual ~ToolBarEvents() = default;

    /// Entries of the drop-down `command`, top to bottom; an "&" that is to be seen stands doubled.
    virtual std::vector<std::wstring> OnDropDown(std::uint32_t command) = 0;
};

/// Menus, tool bars and the cursor of the host's window.
class UserInterface
{
public:
    virtual ~UserInterface() = default;

    virtual void AddMenuResource(std::uint32_t resource) = 0;

    /// Connects `events` (not owned) to the tool bars; null disconnects.
    virtual void SetToolBarEvents(ToolBarEvents* events) = 0;

    /// Is the pane of that number on show? Panes carry the dialogs of the component.
    virtual bool IsPaneShown(std::uint32_t pane) const = 0;

    virtual void BeginWaitCursor() = 0;
    virtual void EndWaitCursor() = 0;
};

} // namespace host
