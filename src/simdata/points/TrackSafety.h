#pragma once

#include <cstdint>

namespace SimulationDataPoints
{

/// Whether frames recorded with one channel layout can be played against another.
enum TRACK_SAFETY : std::int32_t
{
    TRACK_SAFE = 0,
    TRACK_SAFE_WITH_WARNING = 1, ///< the layout is not fully known to match
    TRACK_UNSAFE = 2,            ///< also wherever there is no data point to ask
};

} // namespace SimulationDataPoints
