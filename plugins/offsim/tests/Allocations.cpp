#include "Allocations.h"

#include <atomic>
#include <cstdlib>
#include <new>

// Apart from the tests, so that the compiler can't see through the replaced operators into `malloc`.
namespace
{
std::atomic<long> allocations = 0;
}

long CountedAllocations()
{
    return allocations;
}

void* operator new(std::size_t size)
{
    ++allocations;
    if (void* memory = std::malloc(size > 0 ? size : 1))
        return memory;
    throw std::bad_alloc();
}

void* operator new(std::size_t size, const std::nothrow_t&) noexcept
{
    ++allocations;
    return std::malloc(size > 0 ? size : 1);
}

void operator delete(void* memory) noexcept
{
    std::free(memory);
}

void operator delete(void* memory, std::size_t) noexcept
{
    std::free(memory);
}
