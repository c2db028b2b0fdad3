#pragma once

#include <algorithm>
#include <cstddef>

namespace SimulationDataPoints
{

/// The even grid that the time stamps of a recording lie on, to the microsecond that stamps are rounded to, as long as
/// there is one. Then the frame for a time is computed: in a long recording a look at the stamps costs a wait for the
/// memory.
///
/// Stamp `k`, d microseconds behind the first, is the rounded value of k periods if d - 1/2 <= k * period <= d + 1/2.
/// Each stamp so narrows the periods down that are possible, and the grid ends when none is left.
class VtCTimeGrid
{
public:
    /// The stamp after those before, in seconds.
    void Add(double stamp)
    {
        const double k = static_cast<double>(count++);
        if (k == 0.0)
            first = stamp;
        else if (IsEven())
        {
            const double distance = Ticks(stamp);
            shortest = std::max(shortest, (distance - tolerance) / k);
            longest = distance < farthest ? std::min(longest, (distance + tolerance) / k) : 0.0;
        }
    }

    /// False too for periods below a microsecond, where stamps are equal.
    bool IsEven() const { return shortest <= longest; }

    /// Number of the last stamp that is not above `t`, from 0 for the first ever added. `t` is rounded, and lies
    /// between two stamps that were added.
    std::size_t Find(double t) const
    {
        const double period = 0.5 * (shortest + longest);
        const double distance = Ticks(t);
        // The stamp of the quotient may be rounded up beyond `t`, that of the next one down to it.
        auto k = static_cast<std::size_t>(distance / period);
        if (Whole(static_cast<double>(k + 1) * period) <= distance)
            ++k;
        else if (Whole(static_cast<double>(k) * period) > distance)
            --k;
        return k;
    }

    /// The stamp of that number, as it was added but for the last bits.
    double StampAt(std::size_t k) const
    {
        return first + Whole(static_cast<double>(k) * 0.5 * (shortest + longest)) / ticksPerSecond;
    }

    /// Stamps that were added.
    std::size_t GetCount() const { return count; }

private:
    static constexpr double ticksPerSecond = 1e6;
    static constexpr double tolerance = 0.499;          ///< ticks; less than a half, for the errors of the arithmetic
    static constexpr double farthest = 4398046511104.0; ///< 2^42 ticks, 51 days: products are right to 0.001 up to it

    /// `x`, which is below 2^51, rounded. A call of the mathematics library would cost more than all the rest.
    static double Whole(double x)
    {
        constexpr double wholeNumbersOnly = 6755399441055744.0; // 1.5 * 2^52
        return (x + wholeNumbersOnly) - wholeNumbersOnly;
    }

    /// From the first stamp on.
    double Ticks(double t) const { return Whole((t - first) * ticksPerSecond); }

    double first = 0.0;
    double shortest = 1.0; ///< ticks
    double longest = farthest;
    std::size_t count = 0;
};

} // namespace SimulationDataPoints
