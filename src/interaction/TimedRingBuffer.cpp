#include "interaction/TimedRingBuffer.h"

#include <new>

#include "host/Clock.h"

void VtCTimedRingBuffer::Add(const VtCFollowData& placement)
{
    if (!entries)
        entries.reset(new (std::nothrow) std::array<VtCFollowData, capacity>());
    if (!entries)
        return;

    VtCFollowData& entry = (*entries)[static_cast<std::size_t>(writeIndex)];
    entry = placement;
    entry.time = clock.TickCount();

    const std::int32_t next = (writeIndex + 1) % capacity;
    if (next < writeIndex)
        ++wrapCount;
    writeIndex = next;
}

void VtCTimedRingBuffer::GetDelayed(VtCFollowData& placement, std::int32_t delay) const
{
    if (!entries)
        return;

    std::int64_t age = 1;
    std::uint32_t last = clock.TickCount();
    // Walks back from `from` while entries lie above `floor`; gives where it stopped.
    const auto walk = [&](std::int32_t from, std::int32_t floor)
    {
        std::int32_t i = from;
        for (; i > floor && age < delay; --i)
        {
            const std::uint32_t time = (*entries)[static_cast<std::size_t>(i)].time;
            age += static_cast<std::uint32_t>(last - time);
            last = time;
        }
        return i;
    };

    std::int32_t stopped = walk(writeIndex - 1, -1);
    if (wrapCount != 0 && age < delay && writeIndex < capacity - 1)
        stopped = walk(capacity - 1, writeIndex);
    if (age < delay)
        return;
    placement.rotation = (*entries)[static_cast<std::size_t>(stopped + 1)].rotation;
}

void VtCTimedRingBuffer::Clear()
{
    entries.reset();
    writeIndex = 0;
    wrapCount = 0;
}
