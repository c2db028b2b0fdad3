#pragma once

#include <cstddef>

namespace simtest
{

/// Heap allocations of this program since its start; not counted under the address sanitizer.
std::size_t Allocations();

} // namespace simtest
