#include "app/GlidePanelToolBarEventsSink.h"

#include "base/Text.h"
#include "simdata/SimulationDataController.h"
#include "simdata/SimulationDataRouter.h"

std::vector<std::wstring> VtCGlidePanelToolBarEventsSink::OnDropDown(std::uint32_t command)
{
    std::vector<std::wstring> entries;
    if (command != dataPointDropDown || !controller)
        return entries;
    const VtCSimulationDataRouter& router = controller->GetRouter();
    // A single "&" of a menu text would vanish and underline the letter behind it.
    for (const std::wstring& name : router.GetPointNames(VtCSimulationDataRouter::sources))
        entries.push_back(base::Replace(router.GetConfigurationText(name, 0), L"&", L"&&"));
    return entries;
}
