#pragma once

#include <cstddef>

namespace SimulationDataPoints
{

/// A block of zeroed memory straight from the system, in large pages where it gives them. Pages cost nothing until
/// they are touched, so a ring may be sized for the longest run.
class VtCFrameBlock
{
public:
    /// Throws `std::bad_alloc` when `size` can't be had.
    explicit VtCFrameBlock(std::size_t size);
    ~VtCFrameBlock();
    VtCFrameBlock(const VtCFrameBlock&) = delete;
    VtCFrameBlock& operator=(const VtCFrameBlock&) = delete;

    std::byte* Data() const { return data; }

    /// `a` times `b`; throws `std::bad_alloc` on overflow.
    static std::size_t Product(std::size_t a, std::size_t b);

private:
    std::byte* start = nullptr; ///< of what the system gave
    std::size_t reserved = 0;
    std::byte* data = nullptr;
    std::size_t bytes;
};

} // namespace SimulationDataPoints
