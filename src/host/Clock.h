#pragma once

#include <cstdint>

namespace host
{

/// Time as the component sees it. A test's clock stands still until the test moves it.
class Clock
{
public:
    virtual ~Clock() = default;

    /// Milliseconds since some start. Wraps at 2 to the power 32, after 49.7 days.
    virtual std::uint32_t TickCount() const = 0;

    /// Monotonic high-resolution counter, at least microseconds; never 0.
    virtual std::int64_t Counter() const = 0;

    /// Counts of `Counter` in a second.
    virtual std::int64_t CounterFrequency() const = 0;

    /// Holds the calling thread up for `milliseconds`.
    virtual void Sleep(std::uint32_t milliseconds) = 0;
};

} // namespace host
