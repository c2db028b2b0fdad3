#pragma once

#include <cstdint>
#include <filesystem>
#include <string>

#include "simdata/points/ChannelDescription.h"
#include "simdata/points/MotionDataDamage.h"

namespace SimulationDataPoints
{

/// What a motion data file holds.
struct VtTMotionDataInfo
{
    std::wstring error; ///< with the path; empty when the rest is filled

    VtTChannelDescription channels;
    std::uint64_t fileBytes = 0;
    std::uint64_t frames = 0; ///< usable ones
    double firstTime = 0.0;   ///< seconds; without time stamps or frames both are 0
    double lastTime = 0.0;
    double meanRate = 0.0;   ///< frames a second, (frames - 1) over the span; 0 where that is none
    bool unfinished = false; ///< still being written, or its writer died
    VtTMotionDataDamage damage;
};

/// Reads all of the file, in chunks.
VtTMotionDataInfo ReadMotionDataInfo(const std::filesystem::path& path);

} // namespace SimulationDataPoints
