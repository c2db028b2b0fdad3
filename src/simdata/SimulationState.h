#pragma once

#include <cstdint>

/// Where the data come from: a source that streams, or the frames in the buffer.
enum class VtESimulationMode : std::int32_t
{
    Online = 0,
    Offline = 1,
};

/// What the replay does. Meaningful offline only.
enum class VtEPlayState : std::int32_t
{
    PlayStopped = 0,
    PlayOnce = 1,      ///< to the end of the buffer
    PlayLoop = 2,      ///< starts again at the end
    SpoolBackward = 3, ///< while the button is held down
    SpoolForward = 4,
};
