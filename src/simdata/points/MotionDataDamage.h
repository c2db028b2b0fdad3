#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace SimulationDataPoints
{

/// A value of a frame that is no finite number.
struct VtTNonFiniteValue
{
    std::uint64_t frame = 0; ///< from 1
    std::wstring channel;
};

/// What is wrong with a motion data file that can be used all the same.
struct VtTMotionDataDamage
{
    static constexpr std::size_t maxNamed = 5;

    std::uint64_t framesExpected = 0; ///< by the header, 0 when it doesn't count
    std::uint64_t framesWhole = 0;    ///< that the file holds
    std::uint64_t partialBytes = 0;   ///< of a frame that the file ends in
    std::uint64_t excessBytes = 0;    ///< behind the last frame that the header counts

    std::uint64_t framesOutOfOrder = 0; ///< left out from the first one on whose time decreases
    std::uint64_t decreaseFrame = 0;    ///< that one, from 1
    double timeBefore = 0.0;
    double timeAfter = 0.0;

    std::uint64_t nonFinitePoses = 0;
    std::uint64_t nonFiniteValues = 0;        ///< of instrument streams
    std::vector<VtTNonFiniteValue> nonFinite; ///< the first `maxNamed` of both

    bool IsAny() const;

    /// One sentence for each kind of damage, without the path.
    std::vector<std::wstring> Texts() const;
};

} // namespace SimulationDataPoints
