#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

struct VtTCommandState;

/// Where the run stands, for the frame number, the time and the slider over the frames.
struct VtTShownFrame
{
    std::uint32_t number = 0; ///< from 1; 0 without a frame
    std::uint32_t count = 0;  ///< frames in the buffer of the chosen point
    bool canEnter = false;    ///< may a frame number be typed?
    bool canSeek = false;     ///< may the slider be moved?
};

/// The window of the controller's dialog, as the dialog sees it: it shows what it is told and passes on what the user
/// does. A toolkit implements it.
class VtIControllerDialogView
{
public:
    virtual ~VtIControllerDialogView() = default;

    /// From now on `OnTimer` of the dialog is due every `period` milliseconds, until the window goes.
    virtual void StartTimer(std::uint32_t period) = 0;

    /// The entries of the list of points, one of them chosen.
    virtual void ShowPoints(const std::vector<std::wstring>& entries, std::size_t chosen) = 0;

    /// Comes with every frame while nothing plays, so equal values must cost little.
    virtual void ShowFrame(const VtTShownFrame& frame, const std::wstring& timeText) = 0;

    virtual void ShowSpeed(std::uint32_t position, const std::wstring& text) = 0;

    /// The state of the control of that command number; likewise told often.
    virtual void ShowCommand(std::uint32_t command, const VtTCommandState& state) = 0;

    /// The dialog ends before its window: the window must not use it any more.
    virtual void OnDialogGone() = 0;
};
