// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <mutex>
#include <utility>

namespace probeview {

// A small value that one thread sets and another reads. Reading and setting copy; nobody holds the lock while working.
template <typename T>
class Guarded {
 public:
  T get() const {
    const std::lock_guard lock(mutex_);
    return value_;
  }
  void set(T value) {
    const std::lock_guard lock(mutex_);
    // The old value is destroyed after the lock is released: its destructor may do anything.
    std::swap(value_, value);
  }

 private:
  mutable std::mutex mutex_;
  T value_{};
};

}  // namespace probeview
