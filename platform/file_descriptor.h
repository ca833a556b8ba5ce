// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <fcntl.h>
#include <unistd.h>

#include <cstddef>
#include <utility>
#include <vector>

namespace probeview {

// Owns one descriptor and closes it.
class FileDescriptor {
 public:
  FileDescriptor() = default;
  explicit FileDescriptor(int number) noexcept : number_(number) {}
  FileDescriptor(FileDescriptor&& other) noexcept : number_(std::exchange(other.number_, -1)) {}
  FileDescriptor& operator=(FileDescriptor&& other) noexcept {
    std::swap(number_, other.number_);
    return *this;
  }
  ~FileDescriptor() { close(); }

  int number() const noexcept { return number_; }
  explicit operator bool() const noexcept { return number_ >= 0; }
  int release() noexcept { return std::exchange(number_, -1); }
  void close() noexcept {
    if (number_ >= 0) ::close(std::exchange(number_, -1));
  }

 private:
  int number_ = -1;
};

// Whether the process may still open so many descriptors, for toolkits that abort where they get none.
inline bool mayOpenDescriptors(std::size_t count) {
  std::vector<FileDescriptor> all;
  all.reserve(count);
  while (all.size() < count) {
    all.emplace_back(::open("/dev/null", O_RDONLY | O_CLOEXEC));
    if (!all.back()) return false;
  }
  return true;
}

}  // namespace probeview
