#include "simdata/tests/Allocations.h"

#include <atomic>
#include <cstdlib>
#include <new>

namespace
{
std::atomic<std::size_t> allocations{0};
}

std::size_t simtest::Allocations()
{
    return allocations;
}

// The address sanitizer has operators of its own, which must see every block from both ends.
#ifndef __SANITIZE_ADDRESS__

void* operator new(std::size_t size)
{
    ++allocations;
    if (void* block = std::malloc(size > 0 ? size : 1))
        return block;
    throw std::bad_alloc();
}

void operator delete(void* block) noexcept
{
    std::free(block);
}

void operator delete(void* block, std::size_t) noexcept
{
    std::free(block);
}

#endif
