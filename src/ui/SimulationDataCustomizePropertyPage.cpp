#include "ui/SimulationDataCustomizePropertyPage.h"

#include <cmath>

#include "host/Messages.h"
#include "simdata/SimulationDataController.h"

namespace
{

constexpr std::uint32_t textBoxTitle = 6893;
constexpr std::uint32_t textNextTime = 6894;
constexpr std::uint32_t textPageTitle = 9180;
constexpr std::uint32_t textSimulationFrames = 9181;
constexpr std::uint32_t textTrackFrames = 9182;
constexpr std::uint32_t textUsedTrackFrames = 9183;

constexpr std::size_t simulationField = 0;

} // namespace

VtCSimulationDataCustomizePropertyPage::VtCSimulationDataCustomizePropertyPage(
    VtCSimulationDataController& simulationController, const host::Texts& displayTexts,
    host::MessageService* messageService, std::int32_t framesOfTracks)
    : controller(simulationController),
      texts(displayTexts),
      messages(messageService),
      minimum(VtCSimulationDataController::GetMinimumBufferFrames()),
      total(controller.GetTrackBufferFrames() + controller.GetSimulationBufferFrames()),
      maximum(total - minimum),
      simulationFrames(controller.GetSimulationBufferFrames()),
      trackFrames(controller.GetTrackBufferFrames()),
      usedTrackFrames(framesOfTracks)
{
}

void VtCSimulationDataCustomizePropertyPage::SetSimulationFrames(std::int32_t frames)
{
    if (frames < minimum || frames > maximum)
        return;
    simulationFrames = frames;
    trackFrames = total - frames;
}

std::wstring VtCSimulationDataCustomizePropertyPage::GetTitle() const
{
    return texts.GetText(textPageTitle);
}

std::vector<SimulationDataPoints::VtTSettingsField> VtCSimulationDataCustomizePropertyPage::GetFields() const
{
    return {{.label = texts.GetText(textSimulationFrames),
             .value = static_cast<double>(simulationFrames),
             .editable = minimum <= maximum,
             .minimum = static_cast<double>(minimum),
             .maximum = static_cast<double>(maximum)},
            {.label = texts.GetText(textTrackFrames), .value = static_cast<double>(trackFrames)},
            {.label = texts.GetText(textUsedTrackFrames), .value = static_cast<double>(usedTrackFrames)}};
}

void VtCSimulationDataCustomizePropertyPage::OnFieldChanged(std::size_t field, double value)
{
    // Compared as it comes, since what lies far outside doesn't fit into the integer.
    if (field == simulationField && value >= minimum && value <= maximum)
        SetSimulationFrames(static_cast<std::int32_t>(std::lround(value)));
}

void VtCSimulationDataCustomizePropertyPage::OnOK()
{
    if (controller.SetBufferSizes(simulationFrames, trackFrames) && messages)
        messages->Show({.text = texts.GetText(textNextTime), .title = texts.GetText(textBoxTitle)});
}
