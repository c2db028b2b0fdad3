#pragma once

#include "host/Clock.h"

namespace hosts
{

/// The machine's monotonic clock.
class SystemClock : public host::Clock
{
public:
    std::uint32_t TickCount() const override;

    /// Nanoseconds.
    std::int64_t Counter() const override;
    std::int64_t CounterFrequency() const override { return 1000000000; }

    /// A signal ends it early, so that a loop can look at what the signal asked for.
    void Sleep(std::uint32_t milliseconds) override;
};

} // namespace hosts
