#include "ui/SimulationDataCustomizeSheet.h"

#include <memory>
#include <vector>

#include "base/Text.h"
#include "host/Messages.h"
#include "host/PropertySheets.h"
#include "host/Questions.h"
#include "simdata/points/SettingsPage.h"
#include "simdata/SimulationDataController.h"
#include "ui/SimulationDataCustomizePropertyPage.h"

using SimulationDataPoints::VtCSettingsPage;
using SimulationDataPoints::VtCSimulationDataPoint;

namespace
{

constexpr std::uint32_t textSheetTitle = 6893;
constexpr std::uint32_t textPointTitle = 6903;

constexpr const wchar_t* motionDataFilter = L"Motion Data file (*.mdf)|*.mdf||";

bool IsFilePoint(const std::wstring& name)
{
    return base::EqualsNoCase(name, L"File");
}

} // namespace

VtCSimulationDataCustomizeSheet::VtCSimulationDataCustomizeSheet(VtCSimulationDataController& simulationController,
                                                                 const VtTCustomizeServices& hostServices)
    : controller(simulationController), services(hostServices)
{
    controller.SetCustomizeSheet(this);
}

VtCSimulationDataCustomizeSheet::~VtCSimulationDataCustomizeSheet()
{
    controller.SetCustomizeSheet(nullptr);
}

void VtCSimulationDataCustomizeSheet::Customize()
{
    if (!services.sheets)
        return;
    VtCSimulationDataRouter& router = controller.GetRouter();
    router.ResetMessageStack();

    std::vector<std::unique_ptr<VtCSettingsPage>> pages;
    pages.push_back(
        std::make_unique<VtCSimulationDataCustomizePropertyPage>(controller, services.texts, services.messages));
    std::size_t start = 0;
    const std::wstring activeName = router.GetActivePointName(0);
    for (const VtTDataPointPtr& point : router.GetPoints())
    {
        std::unique_ptr<VtCSettingsPage> page(point->IsSource() ? point->CreatePropertyPage() : nullptr);
        if (!page)
            continue;
        if (point.get() == router.GetActivePoint(0))
            start = pages.size();
        pages.push_back(std::move(page));
    }

    std::vector<VtCSettingsPage*> shown;
    for (const auto& page : pages)
        shown.push_back(page.get());
    if (services.sheets->ShowPropertySheet(services.texts.GetText(textSheetTitle), shown, start))
    {
        for (VtCSettingsPage* page : shown)
            page->OnOK();
        TellPoints(activeName);
    }
    router.ReportMessages();
}

// Every list of points takes up the new texts; the last one told is the one that stays chosen.
void VtCSimulationDataCustomizeSheet::TellPoints(const std::wstring& activeName)
{
    VtCSimulationDataRouter& router = controller.GetRouter();
    for (const std::wstring& name : router.GetPointNames(VtCSimulationDataRouter::sources))
        router.NotifyConfiguration(router.GetConfigurationText(name, 0));
    if (activeName.empty())
        return router.NotifyConfiguration({});
    router.SelectPoint(activeName);
    router.NotifyConfiguration(router.GetConfigurationText(activeName, 0));
}

bool VtCSimulationDataCustomizeSheet::CanCustomizePoint(const std::wstring& name) const
{
    if (IsFilePoint(name))
        return services.questions != nullptr;
    VtCSimulationDataPoint* point = services.sheets ? controller.GetRouter().FindPoint(name) : nullptr;
    return point && std::unique_ptr<VtCSettingsPage>(point->CreatePropertyPage());
}

void VtCSimulationDataCustomizeSheet::CustomizePoint(const std::wstring& name)
{
    if (!controller.GetRouter().FindPoint(name) || !CanCustomizePoint(name))
        return;
    if (IsFilePoint(name))
        ChooseFile();
    else
        ShowOwnPage(name);
}

void VtCSimulationDataCustomizeSheet::ChooseFile()
{
    if (const auto path = services.questions->AskOpenFile({{}, motionDataFilter, L"mdf", L"*.mdf"}))
        controller.LoadMotionData(*path);
}

void VtCSimulationDataCustomizeSheet::ShowOwnPage(const std::wstring& name)
{
    VtCSimulationDataRouter& router = controller.GetRouter();
    const std::unique_ptr<VtCSettingsPage> page(router.FindPoint(name)->CreatePropertyPage());
    if (!services.sheets->ShowPropertySheet(services.texts.GetText(textPointTitle), {page.get()}, 0))
        return;
    page->OnOK();
    router.NotifyConfiguration(router.GetConfigurationText(name, 0));
    router.ReportMessages();
}
