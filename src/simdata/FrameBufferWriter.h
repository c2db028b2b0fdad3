#pragma once

#include <string>

#include "simdata/SimulationServices.h"

namespace SimulationDataPoints
{
class VtCSimulationDataPoint;
}

/// Writes the frames that a data point holds to a motion data file, under two progress activities: 32 for the whole,
/// 44 for the frames.
class VtCFrameBufferWriter
{
public:
    explicit VtCFrameBufferWriter(const VtTSimulationServices& hostServices) : services(hostServices) {}

    /// Writes the `count` frames of `source` through `writer`, which knows the channels already and isn't configured
    /// yet. The cursor of `source` ends where it was. True if the file stands whole; what went wrong is on the
    /// writer's message stack.
    bool Write(SimulationDataPoints::VtCSimulationDataPoint& source, unsigned long count,
               SimulationDataPoints::VtCSimulationDataPoint& writer, const std::wstring& path,
               const std::wstring& type) const;

private:
    bool WriteFrames(SimulationDataPoints::VtCSimulationDataPoint& source, unsigned long count,
                     SimulationDataPoints::VtCSimulationDataPoint& writer) const;

    const VtTSimulationServices& services;
};
