#pragma once

/// Heap allocations by `new` in this process so far, those of loaded modules included.
long CountedAllocations();
