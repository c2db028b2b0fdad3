#include "simdata/points/FrameBlock.h"

#include <new>
#include <sys/mman.h>

namespace SimulationDataPoints
{

namespace
{
constexpr std::size_t largePage = 2 << 20;
}

VtCFrameBlock::VtCFrameBlock(std::size_t size) : bytes(size == 0 ? 1 : size)
{
    // Room for one large page more, so that the data can start on its boundary: only whole pages can be large.
    const bool large = bytes >= largePage;
    reserved = large ? bytes + largePage : bytes;
    if (reserved < bytes)
        throw std::bad_alloc();
    void* memory = mmap(nullptr, reserved, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS | MAP_NORESERVE, -1, 0);
    if (memory == MAP_FAILED)
        throw std::bad_alloc();
    start = static_cast<std::byte*>(memory);
    data = start;
    if (large)
    {
        const std::size_t over = reinterpret_cast<std::size_t>(start) % largePage;
        data = over == 0 ? start : start + (largePage - over);
        madvise(data, bytes, MADV_HUGEPAGE);
    }
}

VtCFrameBlock::~VtCFrameBlock()
{
    munmap(start, reserved);
}

std::size_t VtCFrameBlock::Product(std::size_t a, std::size_t b)
{
    std::size_t product = 0;
    if (__builtin_mul_overflow(a, b, &product))
        throw std::bad_alloc();
    return product;
}

} // namespace SimulationDataPoints
