#pragma once

#include <array>
#include <cstdint>
#include <memory>

#include "interaction/FollowData.h"

namespace host
{
class Clock;
}

/// The last placements of a followed body, with the wall-clock tick of each.
///
/// Ages are sums of unsigned tick differences, so a wrap of the 32-bit counter costs nothing. Holds 200 entries: 3.3 s
/// at 60 frames a second; above 80 frames a second it never gets as old as the usual delay of 2.5 s. Memory is taken at
/// the first `Add`, and none after it. Not thread safe; the frame cycle owns it.
class VtCTimedRingBuffer
{
public:
    explicit VtCTimedRingBuffer(const host::Clock& hostClock) : clock(hostClock) {}

    /// Appends the placement under the present tick; the oldest entry goes once all are used.
    void Add(const VtCFollowData& placement);

    /// Takes the rotation of the entry whose age first reaches `delay` milliseconds into `placement`, whose position
    /// stays. Leaves it alone while the ring is younger. A delay of 1 or less finds the entry that is written next: the
    /// oldest of a full ring.
    void GetDelayed(VtCFollowData& placement, std::int32_t delay) const;

    void Clear();

private:
    static constexpr std::int32_t capacity = 200;

    struct Ring
    {
        std::array<VtCFollowData, capacity> entries;
        std::array<std::int64_t, capacity> elapsed; ///< milliseconds since the first `Add`; in a row, for the search
    };

    std::int64_t ElapsedAt(std::uint32_t tick) const;

    const host::Clock& clock;
    std::int32_t writeIndex = 0;
    std::int32_t wrapCount = 0;
    std::unique_ptr<Ring> ring;
};
