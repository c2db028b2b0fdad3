#pragma once

#include "simdata/SimulationDataChangeObject.h"

class VtCSimulationDataControllerDialog;

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
