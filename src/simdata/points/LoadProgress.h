#pragma once

#include <cstdint>

namespace SimulationDataPoints
{

/// Where long loads and conversions tell how far they are. The library knows no host: the program's side implements
/// this over its progress display and gives it to `VtCSimulationDataPoint::SetLoadProgress` or to the conversion.
class VtILoadProgress
{
public:
    virtual ~VtILoadProgress() = default;

    /// `done` of `total` bytes or frames under the activity `id`. Comes at most about a hundred times for one load,
    /// the last time with both equal.
    virtual void OnLoadProgress(long id, std::uint64_t done, std::uint64_t total) = 0;
};

} // namespace SimulationDataPoints
