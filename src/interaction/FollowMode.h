#pragma once

#include <cstdint>

/// How an observer's placement comes about, by the index that records hold. Modes from 2 on need a body.
enum VtEFollowMode : std::int32_t
{
    followFree = 0,     ///< nothing is computed; the mouse moves it
    followFixed = 1,    ///< stands at its translation offset
    followRigid = 2,    ///< fixed to the body
    followHeading = 3,  ///< fixed to the body in position and heading, stays level
    followSmooth = 4,   ///< as rigid, with a calmed rotation
    followLookAt = 5,   ///< stands at its translation offset and turns its head to the body
    followPosition = 6, ///< follows the position, keeps its direction
    followAlongX = 7,   ///< takes x and z from the body, y from the offset
    followAlongY = 8,   ///< takes y and z from the body, x from the offset
    followModeCount = 9,
};

inline constexpr bool FollowModeNeedsBody(std::int32_t mode)
{
    return mode != followFree && mode != followFixed;
}
