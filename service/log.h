// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <bit>
#include <cstdint>
#include <string_view>

#include "values/line_sink.h"

namespace probeview {

enum class LogLevel { Error, Warning, Info, Debug };

// The service's log: one line per fact, each with its level. What is less important than the chosen level is not
// written.
class ServiceLog {
 public:
  ServiceLog(LineSink& sink, LogLevel level) : sink_(sink), level_(level) {}

  bool takes(LogLevel level) const { return level <= level_; }
  void write(LogLevel level, std::string_view text);

 private:
  LineSink& sink_;
  LogLevel level_;
};

// The name of a level as it stands on the command line and in the log.
std::string_view nameOf(LogLevel level);

// Whether what has now happened so many times is worth a line: the first, the second, the fourth … time, so that
// whoever does nothing else cannot fill the log.
constexpr bool isWorthTelling(std::uint64_t times) { return std::has_single_bit(times); }

}  // namespace probeview
