#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "simdata/SimulationDataChangeObject.h"
#include "ui/ControllerDialogView.h"

namespace host
{
class UserInterface;
}

class VtCSimulationDataController;
class VtCSimulationDataControllerDialog;
class VtICustomizeSheet;
struct VtTCommandState;

/// Passes on to the controller's dialog what the router tells, as far as the dialog's window is there to show it.
class VtCSimulationDataChangeObjectController : public VtCSimulationDataChangeObject
{
public:
    explicit VtCSimulationDataChangeObjectController(VtCSimulationDataControllerDialog* listeningDialog)
        : dialog(listeningDialog)
    {
    }

    void OnDataPointsChanged(int) override;
    void OnModeChanged(VtESimulationMode mode) override;
    void OnPlayStateChanged(const std::wstring& name, VtEPlayState state) override;
    void OnFrame(const std::wstring& name, SimulationDataPoints::VtCSimulationDataFrame* frame, int frameId,
                 const double* time) override;
    void OnDataPointSelected(const std::wstring& text) override { OnConfigurationChanged(text); }
    void OnDataPointCleared(const std::wstring& text) override { OnConfigurationChanged(text); }
    void OnConfigurationChanged(const std::wstring& text) override;

private:
    VtCSimulationDataControllerDialog* dialog; ///< null: nobody is told
};

/// The controller's dialog without a toolkit: all that it shows and all that its controls do.
///
/// Shows the data points, the frame on show, the speed and the state of each command, and sends the commands. It
/// listens to the router as long as it lives, and must go before the controller. Without a window, and behind a hidden
/// pane, it keeps still.
class VtCSimulationDataControllerDialog
{
public:
    /// The pane of the host that carries the dialog.
    static constexpr std::uint32_t pane = 6247;

    /// Milliseconds; how often the controls follow a run.
    static constexpr std::uint32_t timerPeriod = 300;

    /// Positions of the speed control go from 0 to this.
    static constexpr std::uint32_t lastSpeedPosition = 10;

    /// `customizeSheet` null: nothing can be customised. `userInterface` null: the pane is on show while there is a
    /// window. Neither is owned.
    VtCSimulationDataControllerDialog(VtCSimulationDataController& simulationController,
                                      VtICustomizeSheet* customizeSheet, const host::UserInterface* userInterface);
    ~VtCSimulationDataControllerDialog();
    VtCSimulationDataControllerDialog(const VtCSimulationDataControllerDialog&) = delete;
    VtCSimulationDataControllerDialog& operator=(const VtCSimulationDataControllerDialog&) = delete;

    // The window

    /// The window exists from now on, until `OnDestroy`; not owned.
    void OnInitDialog(VtIControllerDialogView& window);
    void OnDestroy() { view = nullptr; }

    /// The pane came on show: everything is shown anew, for nothing was while it was hidden.
    void OnShowWindow();
    bool HasWindow() const { return view != nullptr; }
    bool IsOnShow() const;

    /// Every `timerPeriod` milliseconds.
    void OnTimer();

    // The user's doings

    /// An entry of the list of points. Refused while the list is disabled.
    void OnPointChosen(std::size_t entry);

    /// Another number was typed, or nothing that is a number: then that of the cursor counts. Nothing moves yet.
    void OnFrameNumberEdited(std::optional<std::uint32_t> number);

    /// Return in the frame number edit.
    void OnFrameNumberEntered() { CommitFrameNumber(); }

    /// The edit lost the focus: what was typed counts, unless Return has dealt with it.
    void OnFrameNumberLeft() { CommitEdit(); }

    /// A click or turn of the speed control by so many positions. False, and nothing changes, beyond the ends and
    /// while the control is disabled.
    bool OnSpeedChange(std::int32_t change);

    /// Pressed and released button of `spoolBack` or `spoolForward`. A press that moved nothing counts as a click,
    /// which steps by one frame.
    void OnSpoolButton(std::uint32_t command, bool held);

    /// Any other command button, by its number.
    void OnCommand(std::uint32_t command);

    /// The button beside the list, for the chosen point alone.
    void OnCustomizePoint();

    /// To frame `number`, as the slider wants it. A replay that runs goes on from there.
    void SeekFrame(std::uint32_t number);

    /// Stops what plays; otherwise plays once, from the first frame when the cursor stands on the last.
    void TogglePlay();

    // What the router tells, by way of the change object

    void RefillPoints();
    void OnModeChanged(VtESimulationMode mode);
    void OnFrame(int frameId, const double* time);
    void OnConfigurationChanged(const std::wstring& text);

    /// Shows the state of every control.
    void UpdateControls();

    /// The active point, which the list shows as its choice; empty for the entry "<None>".
    const std::wstring& GetChosenPoint() const;
    double GetSpeedFactor() const { return speedFactor; }

private:
    VtTCommandState GetState(std::uint32_t command) const;
    bool IsRunning() const;
    bool CanSeek() const;
    std::size_t FindEntry(const std::wstring& name) const;
    void ShowPoints();
    void ShowFrame();
    void ReadCursor();
    void CommitFrameNumber();
    void CommitEdit();

    VtCSimulationDataController& controller;
    VtICustomizeSheet* sheet;
    const host::UserInterface* panes;
    VtIControllerDialogView* view = nullptr;

    std::uint32_t frameNumber = 0;
    std::wstring timeText; ///< "1.04", empty without a time
    std::wstring speedText;
    double speedFactor = 1.0;
    bool refreshDue = false;
    bool editHandled = true; ///< the number in the edit is dealt with, so losing the focus does nothing

    std::vector<std::wstring> pointTexts; ///< "<None>", then the configuration text of each source
    std::vector<std::wstring> pointNames; ///< their names, beginning with ""
    bool chosenHasSettings = false;
    std::uint32_t speedPosition;
    bool ran = false;             ///< a run or replay was seen, and its end has not been shown yet
    unsigned long spoolStart = 0; ///< frame at the cursor when a spool button went down, 0 for none

    VtCSimulationDataChangeObjectController changeObject;
};
