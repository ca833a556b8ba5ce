// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <optional>
#include <string>

namespace probeview {

inline constexpr std::size_t traceFileSizeLimit = 32u << 20;  // bytes; about ninety hours of driving

// The file's whole content, or why it cannot be had. Regular files only, up to traceFileSizeLimit.
struct TraceTextResult {
  std::optional<std::string> text;
  std::string error;
};
TraceTextResult readTraceFile(const std::string& path);

}  // namespace probeview
