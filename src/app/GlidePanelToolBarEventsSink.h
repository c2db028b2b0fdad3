#pragma once

#include "host/Frame.h"

class VtCSimulationDataController;

/// Fills the drop-down of the tool bar from which the user chooses a data point.
class VtCGlidePanelToolBarEventsSink : public host::ToolBarEvents
{
public:
    static constexpr std::uint32_t dataPointDropDown = 38718;

    /// Whose data points are listed (not owned); null for nobody's.
    void SetController(VtCSimulationDataController* newController) { controller = newController; }

    /// For `dataPointDropDown` the configuration texts of the data points that are sources; nothing for others.
    std::vector<std::wstring> OnDropDown(std::uint32_t command) override;

private:
    VtCSimulationDataController* controller = nullptr;
};
