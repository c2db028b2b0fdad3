#pragma once

#include "host/PropertySheets.h"

namespace desktop
{

/// Sheets as dialogs with a tab for each page, over the window that is active.
class PropertySheets : public host::PropertySheets
{
public:
    bool ShowPropertySheet(const std::wstring& title, const std::vector<SimulationDataPoints::VtCSettingsPage*>& pages,
                           std::size_t start) override;
};

} // namespace desktop
