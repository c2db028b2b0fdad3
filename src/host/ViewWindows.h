#pragma once

#include <cstdint>
#include <functional>
#include <memory>
#include <string>

#include "host/Graphics.h"

namespace host
{

/// The window of one pane. The host tells the pane's view of its size, its paints and its input.
class PaneWindow : public Window
{
public:
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

/// Makes the windows of scenes, and keeps what is selected.
class ViewWindows
{
public:
    virtual ~ViewWindows() = default;

    virtual std::unique_ptr<ChildFrameWindow> MakeChildFrame() = 0;

    /// Selects the object with that `internal_id` in the host, alone.
    virtual void SelectObject(const std::wstring& internalId) = 0;
};

} // namespace host
