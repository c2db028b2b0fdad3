#include "interaction/TimedRingBuffer.h"

#include <algorithm>
#include <new>

#include "host/Clock.h"

void VtCTimedRingBuffer::Add(const VtCFollowData& placement)
{
    const bool isFirst = !ring;
    if (isFirst)
        ring.reset(new (std::nothrow) Ring);
    if (!ring)
        return;

    const auto at = static_cast<std::size_t>(writeIndex);
    const std::uint32_t now = clock.TickCount();
    ring->elapsed[at] = isFirst ? 0 : ElapsedAt(now);
    ring->entries[at] = placement;
    ring->entries[at].time = now;

    const std::int32_t next = (writeIndex + 1) % capacity;
    if (next < writeIndex)
        ++wrapCount;
    writeIndex = next;
}

std::int64_t VtCTimedRingBuffer::ElapsedAt(std::uint32_t tick) const
{
    const auto newest = static_cast<std::size_t>((writeIndex + capacity - 1) % capacity);
    return ring->elapsed[newest] + static_cast<std::uint32_t>(tick - ring->entries[newest].time);
}

void VtCTimedRingBuffer::GetDelayed(VtCFollowData& placement, std::int32_t delay) const
{
    if (!ring)
        return;
    if (delay <= 1)
    {
        placement.rotation = ring->entries[static_cast<std::size_t>(writeIndex)].rotation;
        return;
    }

    // Ages start at 1.
    const std::int64_t latest = ElapsedAt(clock.TickCount()) + 1 - delay;
    // The newest entry of a stretch that is old enough.
    const auto search = [&](std::int32_t begin, std::int32_t end) -> const VtCFollowData*
    {
        const auto first = ring->elapsed.begin() + begin;
        const auto behind = std::upper_bound(first, ring->elapsed.begin() + end, latest);
        return behind == first ? nullptr : &ring->entries[static_cast<std::size_t>(behind - ring->elapsed.begin() - 1)];
    };

    const VtCFollowData* found = search(0, writeIndex);
    if (!found && wrapCount != 0)
        found = search(writeIndex + 1, capacity);
    if (found)
        placement.rotation = found->rotation;
}

void VtCTimedRingBuffer::Clear()
{
    ring.reset();
    writeIndex = 0;
    wrapCount = 0;
}
