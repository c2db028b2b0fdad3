#pragma once

#include <cstdint>

#include "simdata/points/SettingsPage.h"

namespace host
{
class MessageService;
class Texts;
} // namespace host

class VtCSimulationDataController;

/// The controller's own page: how many of the buffered frames go to the data points, and how many are left for the
/// tracks. The two share a total that stays.
class VtCSimulationDataCustomizePropertyPage : public SimulationDataPoints::VtCSettingsPage
{
public:
    /// `messageService` null: nobody is told that the sizes take effect later. `framesOfTracks`: what the tracks hold
    /// now.
    VtCSimulationDataCustomizePropertyPage(VtCSimulationDataController& simulationController,
                                           const host::Texts& displayTexts, host::MessageService* messageService,
                                           std::int32_t framesOfTracks = 0);

    /// A value outside `minimum` to `maximum` isn't taken.
    void SetSimulationFrames(std::int32_t frames);

    std::int32_t GetSimulationFrames() const { return simulationFrames; }
    std::int32_t GetTrackFrames() const { return trackFrames; }
    std::int32_t GetMinimum() const { return minimum; }
    std::int32_t GetMaximum() const { return maximum; }

    std::wstring GetTitle() const override;
    std::vector<SimulationDataPoints::VtTSettingsField> GetFields() const override;
    void OnFieldChanged(std::size_t field, double value) override;
    void OnOK() override;

private:
    VtCSimulationDataController& controller;
    const host::Texts& texts;
    host::MessageService* messages;

    std::int32_t minimum;
    std::int32_t total;
    std::int32_t maximum; ///< below `minimum` when the total is too small to share: then nothing can be changed
    std::int32_t simulationFrames;
    std::int32_t trackFrames; ///< `total` less `simulationFrames`
    std::int32_t usedTrackFrames;
};
