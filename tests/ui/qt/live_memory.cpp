// SPDX-License-Identifier: Apache-2.0
#include "tests/ui/qt/live_memory.h"

#include <errno.h>
#include <malloc.h>

#include <atomic>
#include <cstdint>

#ifdef COUNT_LIVE_MEMORY

// The C library's own, under the names that remain when a program brings functions in their place.
extern "C" {
void* __libc_malloc(std::size_t size);
void* __libc_calloc(std::size_t count, std::size_t size);
void* __libc_realloc(void* memory, std::size_t size);
void* __libc_memalign(std::size_t alignment, std::size_t size);
void __libc_free(void* memory);
}

namespace {

std::atomic<std::size_t> allocations = 0;
std::atomic<std::size_t> bytes = 0;

void* taken(void* memory) {
  if (memory == nullptr) return nullptr;
  allocations.fetch_add(1, std::memory_order_relaxed);
  bytes.fetch_add(::malloc_usable_size(memory), std::memory_order_relaxed);
  return memory;
}

void given(void* memory) {
  if (memory == nullptr) return;
  allocations.fetch_sub(1, std::memory_order_relaxed);
  bytes.fetch_sub(::malloc_usable_size(memory), std::memory_order_relaxed);
}

}  // namespace

extern "C" {

void* malloc(std::size_t size) { return taken(__libc_malloc(size)); }
void* calloc(std::size_t count, std::size_t size) { return taken(__libc_calloc(count, size)); }
void* memalign(std::size_t alignment, std::size_t size) { return taken(__libc_memalign(alignment, size)); }
void* aligned_alloc(std::size_t alignment, std::size_t size) { return taken(__libc_memalign(alignment, size)); }
int posix_memalign(void** memory, std::size_t alignment, std::size_t size) {
  void* const found = taken(__libc_memalign(alignment, size));
  if (found == nullptr) return ENOMEM;
  *memory = found;
  return 0;
}
void* realloc(void* memory, std::size_t size) {
  const std::size_t before = memory == nullptr ? 0 : ::malloc_usable_size(memory);
  void* const moved = __libc_realloc(memory, size);
  const bool isFreed = memory != nullptr && size == 0;
  if (moved == nullptr && !isFreed) return nullptr;
  if (memory != nullptr) {
    allocations.fetch_sub(1, std::memory_order_relaxed);
    bytes.fetch_sub(before, std::memory_order_relaxed);
  }
  return taken(moved);
}
void free(void* memory) {
  given(memory);
  __libc_free(memory);
}

}  // extern "C"

namespace probeview {

LiveMemory liveMemory() { return {allocations.load(), bytes.load()}; }
bool liveMemoryIsCounted() { return true; }

}  // namespace probeview

#else

namespace probeview {

LiveMemory liveMemory() { return {0, 0}; }
bool liveMemoryIsCounted() { return false; }

}  // namespace probeview

#endif
