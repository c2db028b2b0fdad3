#pragma once

#include <cstdint>
#include <string>

#include "host/Commands.h"

class VtCSimulationDataController;

/// Command numbers of the menus and tool bars that the simulation data controller answers.
namespace ControllerCommand
{
inline constexpr std::uint32_t pointList = 6241;      ///< a control, not a command
inline constexpr std::uint32_t customizePoint = 6242; ///< likewise, as the next
inline constexpr std::uint32_t speedControl = 6681;
inline constexpr std::uint32_t refreshChannels = 38713;
inline constexpr std::uint32_t start = 38714;
inline constexpr std::uint32_t stop = 38715;
inline constexpr std::uint32_t customize = 38716;
inline constexpr std::uint32_t noDataPoint = 38717;
inline constexpr std::uint32_t firstSelect = 38718; ///< the first of the list of sources
inline constexpr std::uint32_t lastSelect = 38723;
inline constexpr std::uint32_t store = 38743;
inline constexpr std::uint32_t refreshData = 38744;
inline constexpr std::uint32_t firstFrame = 38745;
inline constexpr std::uint32_t previousFrame = 38746;
inline constexpr std::uint32_t stopPlay = 38747;
inline constexpr std::uint32_t nextFrame = 38748;
inline constexpr std::uint32_t lastFrame = 38749;
inline constexpr std::uint32_t playLoop = 38750;
inline constexpr std::uint32_t playOnce = 38751;
inline constexpr std::uint32_t spoolBack = 38752;
inline constexpr std::uint32_t spoolForward = 38753;
inline constexpr std::uint32_t videoConfiguration = 38900; ///< a control
} // namespace ControllerCommand

/// What the state of a controller's command is read from: the frames of one data point, the active one with an empty
/// name.
struct VtTPointFrames
{
    const VtCSimulationDataController& controller;
    const std::wstring& point;
};

using VtCControllerCommandTable = host::CommandTable<VtCSimulationDataController, VtTPointFrames>;
