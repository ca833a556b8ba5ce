// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>

namespace probeview::bench {

// How often this program has asked for memory so far.
std::size_t allocationCount() noexcept;

}  // namespace probeview::bench
