#include "tests/support/HeapCount.h"

#include <atomic>
#include <cstdlib>
#include <new>

namespace
{

std::atomic<bool> counting{false};
std::atomic<long> taken{0};

} // namespace

#if !defined(__SANITIZE_ADDRESS__)

bool heap::CanCount()
{
    return true;
}

void* operator new(std::size_t size)
{
    if (counting.load(std::memory_order_relaxed))
        ++taken;
    if (void* memory = std::malloc(size ? size : 1))
        return memory;
    throw std::bad_alloc();
}

void* operator new(std::size_t size, std::align_val_t alignment)
{
    if (counting.load(std::memory_order_relaxed))
        ++taken;
    const auto boundary = static_cast<std::size_t>(alignment);
    if (void* memory = std::aligned_alloc(boundary, (size + boundary - 1) / boundary * boundary))
        return memory;
    throw std::bad_alloc();
}

void operator delete(void* memory) noexcept
{
    std::free(memory);
}

void operator delete(void* memory, std::size_t) noexcept
{
    std::free(memory);
}

void operator delete(void* memory, std::align_val_t) noexcept
{
    std::free(memory);
}

void operator delete(void* memory, std::size_t, std::align_val_t) noexcept
{
    std::free(memory);
}

#else

bool heap::CanCount()
{
    return false;
}

#endif

heap::Count::Count()
{
    taken = 0;
    counting = true;
}

long heap::Count::Stop()
{
    counting = false;
    return taken;
}
