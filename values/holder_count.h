// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <atomic>
#include <cstdint>

namespace probeview {

// How many values hold a piece of memory; stands at the beginning of that piece.
class HolderCount {
 public:
  void add() noexcept { count_.fetch_add(1, std::memory_order_relaxed); }
  // Whether that was the last one, who need not pay for a locked instruction.
  bool remove() noexcept { return isOne() || count_.fetch_sub(1, std::memory_order_acq_rel) == 1; }
  bool isOne() const noexcept { return count_.load(std::memory_order_acquire) == 1; }

 private:
  std::atomic<std::uint32_t> count_{1};
};

}  // namespace probeview
