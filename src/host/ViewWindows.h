#pragma once

#include <cstdint>
#include <functional>
#include <memory>
#include <string>

#include "host/Graphics.h"

namespace host
{

/// Keys that reach a view; all others are the host's.
enum class ViewKey
{
    tab,
    shiftLeft, ///< also a Shift without a side
    shiftRight,
};

/// What the window of a view tells of; the view's input takes it. Positions in pixels from the upper left corner.
class WindowEvents
{
public:
    virtual ~WindowEvents() = default;

    virtual void OnLeftButtonDown(int x, int y) = 0;
    virtual void OnLeftButtonUp(int x, int y) = 0;
    virtual void OnRightButtonDown() = 0;

    /// May be told of a held pointer outside of the window too.
    virtual void OnMouseMove(int x, int y) = 0;
    virtual void OnMouseLeave() = 0;
    virtual void OnLeftDoubleClick(int x, int y) = 0;

    /// Repeats change nothing.
    virtual void OnKey(ViewKey key, bool down) = 0;

    /// Whether a Shift is held, told before a press: it may have gone down while another window had the keyboard.
    virtual void OnShiftState(bool held) = 0;

    /// Another window has the keyboard now, and hears of what is let go.
    virtual void OnFocusLost() = 0;
};

/// A window that a view is seen in.
class ViewWindow : public Window
{
public:
    virtual WindowKind GetKind() const = 0;

    /// Whom the window tells of its input (not owned); null for nobody.
    void SetEvents(WindowEvents* newEvents) { events = newEvents; }
    WindowEvents* GetEvents() const { return events; }

private:
    WindowEvents* events = nullptr;
};

/// The window of one pane. The splitter hears of its size.
class PaneWindow : public ViewWindow
{
public:
    WindowKind GetKind() const override { return WindowKind::pane; }

    /// The drawable area in coordinates of the window around it; empty while collapsed.
    virtual Rectangle GetRectangleInParent() const = 0;

    /// Places the pane; without width or height it collapses. The host tells the view before this returns.
    virtual void SetRectangle(const Rectangle& rectangle) = 0;
};

/// The window that holds the 2 by 2 panes.
class SplitterWindow : public Window
{
public:
    virtual PaneWindow& GetPane(int row, int column) = 0;

    virtual void Hide() = 0;
    virtual void ShowMaximised() = 0;
};

/// The window around one scene's panes.
class ChildFrameWindow
{
public:
    virtual ~ChildFrameWindow() = default;

    virtual SplitterWindow& GetSplitter() = 0;

    /// Calls `tick` every `period` milliseconds from the host's event loop, until `KillTimer`. A timer of that id
    /// starts over.
    virtual void StartTimer(std::uint32_t id, std::uint32_t period, std::function<void()> tick) = 0;
    virtual void KillTimer(std::uint32_t id) = 0;
};

/// A window beside those of a scene's frame, as it is asked for.
struct WindowRequest
{
    WindowKind kind = WindowKind::fullscreen; ///< `editorView` or `fullscreen`; panes come with their frame
    int screen = 0;                           ///< fullscreen: number of the screen, from 0
    std::uintptr_t toolWindow = 0;            ///< editorView: the platform's handle of the tool's window
    int width = 0;                            ///< editorView: the size of that window in pixels
    int height = 0;
};

/// The window, or why there is none, in words for the user.
struct OpenedWindow
{
    std::unique_ptr<ViewWindow> window;
    std::wstring refusal;
};

/// Makes the windows of scenes.
class ViewWindows
{
public:
    virtual ~ViewWindows() = default;

    virtual std::unique_ptr<ChildFrameWindow> MakeChildFrame() = 0;

    /// A window of a kind that this host can't open is refused, and nothing else is opened in its place.
    virtual OpenedWindow OpenWindow(const WindowRequest& request) = 0;
};

} // namespace host
