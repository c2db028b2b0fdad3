#pragma once

#include <cstdint>
#include <map>

#include <QDockWidget>

#include "ui/ControllerDialogView.h"

class QComboBox;
class QHBoxLayout;
class QLabel;
class QLineEdit;
class QSlider;
class QTimer;
class QToolButton;
class VtCSimulationDataControllerDialog;

namespace host
{
class Texts;
}

namespace desktop
{

class CommandActions;
class SpeedControl;

/// The pane of the controller's dialog: the list of data points, the frames under a slider, and the buttons of a
/// player. It shows what the dialog says and passes on what the user does; it decides nothing. The states of commands
/// that the dialog tells show in the actions, so wherever a command has a button.
///
/// Return and Escape in one of its fields give the keyboard back to the window, and Escape forgets a number that was
/// typed. The dialog may go before it: then it stays empty and does nothing.
class ControllerDock : public QDockWidget, private VtIControllerDialogView
{
public:
    /// `window` is the parent. `commandActions` has the controller's commands and outlives this.
    ControllerDock(VtCSimulationDataControllerDialog& shownDialog, CommandActions& commandActions,
                   const host::Texts& displayTexts, QWidget& window);
    ~ControllerDock() override;

    /// Is the pane on show, not closed and not behind another tab? The host's answer for the dialog's pane.
    bool IsOnShow() const { return onShow; }

protected:
    bool eventFilter(QObject* field, QEvent* event) override;

private:
    void StartTimer(std::uint32_t period) override;
    void ShowPoints(const std::vector<std::wstring>& entries, std::size_t chosen) override;
    void ShowFrame(const VtTShownFrame& newFrame, const std::wstring& timeText) override;
    void ShowSpeed(std::uint32_t position, const std::wstring& text) override;
    void ShowCommand(std::uint32_t command, const VtTCommandState& state) override;
    void OnDialogGone() override;

    QWidget* MakePointRow();
    QWidget* MakeFrameRow();
    QWidget* MakePlayRow();
    QToolButton* AddButton(QHBoxLayout* row, std::uint32_t command);
    void AddCommand(QHBoxLayout* row, std::uint32_t command);
    QToolButton* AddOwnButton(QHBoxLayout* row, std::uint32_t command);
    void AddSpool(QHBoxLayout* row, std::uint32_t command);
    void Explain(QWidget* widget, std::uint32_t text) const;
    void ReadFrameEdit(const QString& text);
    void LeaveFrameEdit();
    void OnVisibilityChanged(bool visible);

    VtCSimulationDataControllerDialog* dialog; ///< null once it is gone
    CommandActions& actions;
    const host::Texts& texts;
    VtTShownFrame frame;
    bool onShow = false;

    QComboBox* points = nullptr;
    QSlider* slider = nullptr;
    QLineEdit* frameEdit = nullptr;
    QLabel* frameCount = nullptr;
    QLabel* time = nullptr;
    SpeedControl* speed = nullptr;
    QTimer* timer = nullptr;
    std::map<std::uint32_t, QToolButton*> ownButtons; ///< by command; those that do more than their command
};

} // namespace desktop
