#pragma once

#include <cstddef>
#include <string>
#include <vector>

namespace SimulationDataPoints
{
class VtCSettingsPage;
}

namespace host
{

/// Shows pages of settings in a window of the host.
class PropertySheets
{
public:
    virtual ~PropertySheets() = default;

    /// Shows `pages` (not owned, at least one) under `title`, opened on the page with the index `start`, and returns
    /// when the user is done. True for OK: the caller then tells the pages so. The idle events go on meanwhile.
    virtual bool ShowPropertySheet(const std::wstring& title,
                                   const std::vector<SimulationDataPoints::VtCSettingsPage*>& pages,
                                   std::size_t start) = 0;
};

} // namespace host
