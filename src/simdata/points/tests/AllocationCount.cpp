// Counts what the library and the tests allocate. In a file of its own: inlined, it would look like a mismatch to the
// compiler.
#include <cstdlib>
#include <new>

#include "simdata/points/tests/TestRun.h"

namespace
{
long allocations = 0;
}

namespace SimulationDataPoints
{

long AllocationCount()
{
    return allocations;
}

} // namespace SimulationDataPoints

void* operator new(std::size_t size)
{
    ++allocations;
    if (void* memory = std::malloc(size == 0 ? 1 : size))
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
