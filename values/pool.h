// SPDX-License-Identifier: Apache-2.0
//
// Memory for the containers of values. A dictionary is made and thrown away for each record that arrives, so each
// thread keeps the small pieces that it let go, by size, and hands them out again. What it keeps is bounded.
#pragma once

#include <cstddef>

namespace probeview {

// Whether threads keep memory at all: not under the address sanitizer, which is to see every use of memory that has
// gone.
#if defined(__SANITIZE_ADDRESS__)
inline constexpr bool keepsMemory = false;
#elif defined(__has_feature)
inline constexpr bool keepsMemory = !__has_feature(address_sanitizer);
#else
inline constexpr bool keepsMemory = true;
#endif

// Aligned for every value. To be given back with the size that was asked for, on any thread.
void* takeMemory(std::size_t size);
void giveMemoryBack(void* memory, std::size_t size) noexcept;

}  // namespace probeview
