#pragma once

#include <cstddef>

namespace simtest
{

/// Heap allocations of this program since its start.
std::size_t Allocations();

} // namespace simtest
