// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace probeview {

// What stands at the beginning of a file, or why that cannot be read, for people.
struct FileBeginning {
  std::optional<std::vector<std::uint8_t>> bytes;
  std::string error;
};

// How long is waited for a pipe to which nobody writes, and for one whose writer says nothing.
struct PipePatience {
  std::chrono::milliseconds writer{2000};
  std::chrono::milliseconds word{30000};
};

// Reads at most so many bytes, byte for byte, of a file, a device or a pipe. Never waits longer than its patience.
FileBeginning readBeginning(const std::string& path, std::size_t most, PipePatience patience = {});

}  // namespace probeview
