#include "ui/SimulationDataChangeObjectController.h"

#include "base/Text.h"
#include "ui/SimulationDataControllerDialog.h"

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
