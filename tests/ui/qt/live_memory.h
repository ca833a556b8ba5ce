// SPDX-License-Identifier: Apache-2.0
//
// What a test program has allocated and not given back, by whatever library and on whatever thread. Resident memory
// does not tell: a leak first fills the room that others have left in the heap.
#pragma once

#include <cstddef>

namespace probeview {

struct LiveMemory {
  std::size_t allocations;
  std::size_t bytes;
};

// Absent memory is counted as none: where a sanitizer owns the allocator, isCounted() is false and both stay 0.
LiveMemory liveMemory();
bool liveMemoryIsCounted();

}  // namespace probeview
