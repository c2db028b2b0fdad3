#pragma once

#include "host/Frame.h"

class VtCPanoramicApp;

/// Fills the drop-down of the tool bar from which the user chooses a data point.
class VtCGlidePanelToolBarEventsSink : public host::ToolBarEvents
{
public:
    static constexpr std::uint32_t dataPointDropDown = 38718;

    explicit VtCGlidePanelToolBarEventsSink(const VtCPanoramicApp& application) : app(application) {}

    /// For `dataPointDropDown` the configuration texts of the data points that are sources; nothing for others.
    std::vector<std::wstring> OnDropDown(std::uint32_t command) override;

private:
    const VtCPanoramicApp& app;
};
