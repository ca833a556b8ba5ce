// SPDX-License-Identifier: Apache-2.0
#include "bench/allocations.h"

#include <cstdlib>
#include <new>

namespace {

std::size_t count = 0;

}  // namespace

namespace probeview::bench {

std::size_t allocationCount() noexcept { return count; }

}  // namespace probeview::bench

// All peers take their memory through these.
void* operator new(std::size_t size) {
  ++count;
  if (void* memory = std::malloc(size == 0 ? 1 : size)) return memory;
  throw std::bad_alloc();
}

void operator delete(void* memory) noexcept { std::free(memory); }
void operator delete(void* memory, std::size_t) noexcept { std::free(memory); }
