#include "ui/SimulationDataControllerDialog.h"

#include <array>

#include <fmt/xchar.h>

#include "base/Text.h"
#include "host/Frame.h"
#include "simdata/SimulationDataController.h"

namespace
{

struct ReplaySpeed
{
    const wchar_t* text;
    double factor;
};

constexpr std::array<ReplaySpeed, VtCSimulationDataControllerDialog::lastSpeedPosition + 1> replaySpeeds{{
    {L"1/32x", 0.03125},
    {L"1/16x", 0.0625},
    {L"1/8x", 0.125},
    {L"1/4x", 0.25},
    {L"1/2x", 0.5},
    {L"1x", 1.0},
    {L"2x", 2.0},
    {L"4x", 4.0},
    {L"8x", 8.0},
    {L"16x", 16.0},
    {L"32x", 32.0},
}};
constexpr std::uint32_t firstSpeedPosition = 5;

constexpr const wchar_t* noPoint = L"<None>";

constexpr std::array commands{
    ControllerCommand::pointList,     ControllerCommand::customizePoint, ControllerCommand::speedControl,
    ControllerCommand::start,         ControllerCommand::stop,           ControllerCommand::customize,
    ControllerCommand::store,         ControllerCommand::refreshData,    ControllerCommand::firstFrame,
    ControllerCommand::previousFrame, ControllerCommand::spoolBack,      ControllerCommand::stopPlay,
    ControllerCommand::spoolForward,  ControllerCommand::nextFrame,      ControllerCommand::lastFrame,
    ControllerCommand::playLoop,      ControllerCommand::playOnce,
};

// Comes with every frame: takes no memory once the text has had its length.
void FormatTime(std::wstring& text, const double* time)
{
    std::array<wchar_t, 400> digits{}; // the largest double has 309 before the point
    text.clear();
    if (time)
        text.assign(digits.data(), fmt::format_to_n(digits.data(), digits.size(), L"{:.2f}", *time).out);
}

} // namespace

VtCSimulationDataControllerDialog::VtCSimulationDataControllerDialog(VtCSimulationDataController& simulationController,
                                                                     VtICustomizeSheet* customizeSheet,
                                                                     const host::UserInterface* userInterface)
    : controller(simulationController),
      sheet(customizeSheet),
      panes(userInterface),
      pointTexts{noPoint},
      pointNames{std::wstring()},
      speedPosition(firstSpeedPosition),
      changeObject(this)
{
    controller.GetRouter().AddChangeObject(&changeObject);
}

VtCSimulationDataControllerDialog::~VtCSimulationDataControllerDialog()
{
    controller.GetRouter().RemoveChangeObject(&changeObject);
    if (view)
        view->OnDialogGone();
}

void VtCSimulationDataControllerDialog::OnInitDialog(VtIControllerDialogView& window)
{
    view = &window;
    view->StartTimer(timerPeriod);
    speedPosition = firstSpeedPosition;
    speedText = replaySpeeds[speedPosition].text;
    speedFactor = replaySpeeds[speedPosition].factor;
    view->ShowSpeed(speedPosition, speedText);
    RefillPoints();
    ReadCursor();
    UpdateControls();
}

void VtCSimulationDataControllerDialog::OnShowWindow()
{
    if (!view)
        return;
    RefillPoints();
    ReadCursor();
    UpdateControls();
}

bool VtCSimulationDataControllerDialog::IsOnShow() const
{
    return view && (!panes || panes->IsPaneShown(pane));
}

bool VtCSimulationDataControllerDialog::IsRunning() const
{
    return controller.IsOnline() || controller.IsPlaying();
}

void VtCSimulationDataControllerDialog::OnTimer()
{
    refreshDue = true;
    const bool ended = ran && !IsRunning();
    ran = IsRunning();
    if (ended && IsOnShow())
        UpdateControls();
}

void VtCSimulationDataControllerDialog::RefillPoints()
{
    VtCSimulationDataRouter& router = controller.GetRouter();
    pointTexts.assign(1, noPoint);
    pointNames.assign(1, {});
    for (std::wstring& name : router.GetPointNames(VtCSimulationDataRouter::sources))
    {
        pointTexts.push_back(router.GetConfigurationText(name, 0));
        pointNames.push_back(std::move(name));
    }
    ShowPoints();
}

// The entry "<None>" when there is no other.
std::size_t VtCSimulationDataControllerDialog::FindEntry(const std::wstring& name) const
{
    for (std::size_t i = 1; i < pointNames.size(); ++i)
        if (base::EqualsNoCase(pointNames[i], name))
            return i;
    return 0;
}

const std::wstring& VtCSimulationDataControllerDialog::GetChosenPoint() const
{
    return controller.GetRouter().GetActivePointName();
}

void VtCSimulationDataControllerDialog::ShowPoints()
{
    const std::wstring& chosen = GetChosenPoint();
    chosenHasSettings = sheet && !chosen.empty() && sheet->CanCustomizePoint(chosen);
    if (view)
        view->ShowPoints(pointTexts, FindEntry(chosen));
}

void VtCSimulationDataControllerDialog::OnPointChosen(std::size_t entry)
{
    if (entry >= pointNames.size() || !GetState(ControllerCommand::pointList).enabled)
        return ShowPoints();
    const std::wstring name = pointNames[entry]; // the list changes while the point is selected
    controller.ChoosePoint(name);
    ShowPoints();
    ReadCursor();
    UpdateControls();
}

void VtCSimulationDataControllerDialog::OnConfigurationChanged(const std::wstring& text)
{
    std::wstring name;
    if (SimulationDataPoints::VtCSimulationDataPoint::ExtractConfigurationInfoText(text, &name, nullptr, nullptr))
    {
        std::size_t entry = FindEntry(name);
        if (entry == 0)
        {
            entry = pointTexts.size();
            pointTexts.emplace_back();
            pointNames.push_back(name);
        }
        pointTexts[entry] = text;
    }
    ShowPoints();
    ReadCursor();
    UpdateControls();
}

void VtCSimulationDataControllerDialog::OnModeChanged(VtESimulationMode mode)
{
    ran = ran || mode == VtESimulationMode::Online;
    UpdateControls();
}

void VtCSimulationDataControllerDialog::OnFrame(int frameId, const double* time)
{
    frameNumber = static_cast<std::uint32_t>(frameId);
    editHandled = true;
    FormatTime(timeText, time);
    if (IsRunning())
    {
        ran = true;
        if (!refreshDue)
            return;
        refreshDue = false;
    }
    UpdateControls();
}

// The time belongs to the frame: beside another number the last one would be wrong.
void VtCSimulationDataControllerDialog::ReadCursor()
{
    VtCSimulationDataRouter& router = controller.GetRouter();
    frameNumber = static_cast<std::uint32_t>(router.GetRecent(GetChosenPoint()));
    editHandled = true;
    const std::optional<double> time = router.GetTimestampOfCurrent();
    FormatTime(timeText, time ? &*time : nullptr);
}

VtTCommandState VtCSimulationDataControllerDialog::GetState(std::uint32_t command) const
{
    if (command == ControllerCommand::customizePoint)
    {
        const bool idle = controller.IsCommandEnabled(GetChosenPoint(), ControllerCommand::customize).enabled;
        return {idle && chosenHasSettings, false};
    }
    VtTCommandState state = controller.IsCommandEnabled(GetChosenPoint(), command);
    if (command == ControllerCommand::customize)
        state.enabled = state.enabled && sheet && sheet->CanCustomize();
    return state;
}

bool VtCSimulationDataControllerDialog::CanSeek() const
{
    const VtCSimulationDataRouter& router = controller.GetRouter();
    return !controller.IsOnline() && router.IsConfigured(GetChosenPoint()) &&
           router.GetBufferedFrames(GetChosenPoint()) > 0;
}

void VtCSimulationDataControllerDialog::UpdateControls()
{
    if (!view)
        return;
    for (const std::uint32_t command : commands)
        view->ShowCommand(command, GetState(command));
    ShowFrame();
}

void VtCSimulationDataControllerDialog::ShowFrame()
{
    if (!view)
        return;
    const std::uint32_t count = static_cast<std::uint32_t>(controller.GetRouter().GetBufferedFrames(GetChosenPoint()));
    const bool canSeek = CanSeek();
    view->ShowFrame({frameNumber, count, canSeek && !controller.IsPlaying(), canSeek}, timeText);
}

void VtCSimulationDataControllerDialog::OnFrameNumberEdited(std::optional<std::uint32_t> number)
{
    frameNumber = number ? *number : static_cast<std::uint32_t>(controller.GetRouter().GetRecent(GetChosenPoint()));
    editHandled = false;
}

void VtCSimulationDataControllerDialog::CommitEdit()
{
    if (!editHandled)
        CommitFrameNumber();
}

void VtCSimulationDataControllerDialog::CommitFrameNumber()
{
    const std::wstring name = GetChosenPoint();
    editHandled = true;
    if (!CanSeek() || controller.IsPlaying() || !controller.GotoFrame(name, static_cast<long>(frameNumber)))
        frameNumber = static_cast<std::uint32_t>(controller.GetRouter().GetRecent(name));
    ShowFrame();
}

bool VtCSimulationDataControllerDialog::OnSpeedChange(std::int32_t change)
{
    // Unsigned, so that a step below 0 ends far above the table.
    const std::uint32_t position = speedPosition + static_cast<std::uint32_t>(change);
    if (position > lastSpeedPosition || !GetState(ControllerCommand::speedControl).enabled)
        return false;
    speedPosition = position;
    speedText = replaySpeeds[position].text;
    speedFactor = replaySpeeds[position].factor;
    controller.SetSpeed(speedFactor);
    if (view)
        view->ShowSpeed(speedPosition, speedText);
    return true;
}

void VtCSimulationDataControllerDialog::OnSpoolButton(std::uint32_t command, bool held)
{
    const bool back = command == ControllerCommand::spoolBack;
    const std::wstring name = GetChosenPoint();
    CommitEdit();
    if (held)
    {
        if (!GetState(command).enabled)
            return;
        spoolStart = controller.GetRouter().GetRecent(name);
        if (controller.BeginSpool(speedFactor))
            controller.SetPlayState(name, back ? VtEPlayState::SpoolBackward : VtEPlayState::SpoolForward);
    }
    else
    {
        // What plays or streams isn't this button's to stop.
        if (!IsRunning())
            controller.SetPlayState(name, VtEPlayState::PlayStopped);
        if (spoolStart != 0 && spoolStart == controller.GetRouter().GetRecent(name))
            controller.OnCmdMsg(command);
        spoolStart = 0;
    }
    UpdateControls();
}

void VtCSimulationDataControllerDialog::OnCommand(std::uint32_t command)
{
    CommitEdit();
    controller.OnCmdMsg(command);
    UpdateControls();
}

void VtCSimulationDataControllerDialog::OnCustomizePoint()
{
    if (!GetState(ControllerCommand::customizePoint).enabled)
        return;
    const std::wstring name = GetChosenPoint();
    sheet->CustomizePoint(name);
    UpdateControls();
}

void VtCSimulationDataControllerDialog::SeekFrame(std::uint32_t number)
{
    if (!CanSeek())
        return;
    const std::wstring name = GetChosenPoint();
    const VtEPlayState state = controller.GetPlayState();
    // The replay's clock starts at the cursor; moving the cursor alone would be undone by the next step.
    if (controller.IsPlaying())
        controller.StopPlay();
    controller.GotoFrame(name, static_cast<long>(number));
    if (state == VtEPlayState::PlayOnce)
        controller.PlayOnce();
    else if (state == VtEPlayState::PlayLoop)
        controller.PlayLoop();
}

void VtCSimulationDataControllerDialog::TogglePlay()
{
    using namespace ControllerCommand;
    if (controller.IsPlaying())
        return OnCommand(stopPlay);
    CommitEdit();
    if (!GetState(playOnce).enabled && GetState(firstFrame).enabled)
        controller.OnCmdMsg(firstFrame);
    OnCommand(playOnce);
}

// The list of points is filled behind a hidden pane too; all else waits until the pane comes on show.
void VtCSimulationDataChangeObjectController::OnDataPointsChanged(int)
{
    if (dialog && dialog->HasWindow())
        dialog->RefillPoints();
}

void VtCSimulationDataChangeObjectController::OnModeChanged(VtESimulationMode mode)
{
    if (dialog && dialog->IsOnShow())
        dialog->OnModeChanged(mode);
}

void VtCSimulationDataChangeObjectController::OnPlayStateChanged(const std::wstring& name, VtEPlayState)
{
    if (dialog && dialog->IsOnShow() && !name.empty() && base::EqualsNoCase(name, dialog->GetChosenPoint()))
        dialog->UpdateControls();
}

void VtCSimulationDataChangeObjectController::OnFrame(const std::wstring& name,
                                                      SimulationDataPoints::VtCSimulationDataFrame* frame, int frameId,
                                                      const double* time)
{
    if (dialog && dialog->IsOnShow() && !name.empty() && frame)
        dialog->OnFrame(frameId, time);
}

void VtCSimulationDataChangeObjectController::OnConfigurationChanged(const std::wstring& text)
{
    if (dialog && dialog->IsOnShow())
        dialog->OnConfigurationChanged(text);
}
