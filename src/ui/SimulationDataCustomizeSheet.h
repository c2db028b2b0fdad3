#pragma once

#include "simdata/SimulationServices.h"

namespace host
{
class MessageService;
class PropertySheets;
class Questions;
class Texts;
} // namespace host

class VtCSimulationDataController;

/// What the customise sheet needs from the host. A null service leaves out what needs it.
struct VtTCustomizeServices
{
    const host::Texts& texts;
    host::MessageService* messages = nullptr;
    host::PropertySheets* sheets = nullptr;
    host::Questions* questions = nullptr;
};

/// The customise sheet of the controller and of its data points. Answers the controller's command as long as it lives,
/// and must go before the controller.
class VtCSimulationDataCustomizeSheet : public VtICustomizeSheet
{
public:
    VtCSimulationDataCustomizeSheet(VtCSimulationDataController& simulationController,
                                    const VtTCustomizeServices& hostServices);
    ~VtCSimulationDataCustomizeSheet() override;
    VtCSimulationDataCustomizeSheet(const VtCSimulationDataCustomizeSheet&) = delete;
    VtCSimulationDataCustomizeSheet& operator=(const VtCSimulationDataCustomizeSheet&) = delete;

    bool CanCustomize() const override { return services.sheets != nullptr; }
    void Customize() override;
    bool CanCustomizePoint(const std::wstring& name) const override;
    void CustomizePoint(const std::wstring& name) override;

private:
    void TellPoints(const std::wstring& activeName);
    void ChooseFile();
    void ShowOwnPage(const std::wstring& name);

    VtCSimulationDataController& controller;
    VtTCustomizeServices services;
};
