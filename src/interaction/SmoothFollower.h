#pragma once

#include <cstdint>

#include "interaction/TimedRingBuffer.h"

/// Calms the rotation of a camera that rides on a body: it leans by 7 percent towards where the body pointed a while
/// ago, 2.5 s unless told otherwise. The delay goes by the wall clock, so the picture is as calm at every replay speed.
///
/// While fewer than `delay` milliseconds are known it leans towards the identity instead.
class VtCSmoothFollower
{
public:
    explicit VtCSmoothFollower(const host::Clock& clock) : ring(clock) {}

    /// Notes `current` and puts the calmed rotation into `result`; its position stays.
    void Follow(const VtCFollowData& current, VtCFollowData& result);

    void SetDelay(std::int32_t milliseconds) { delay = milliseconds; }

    /// Forgets all placements, for a run that begins anew.
    void Clear() { ring.Clear(); }

private:
    VtCTimedRingBuffer ring;
    std::int32_t delay = 2500;
};
