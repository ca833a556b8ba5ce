// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <bit>
#include <chrono>
#include <cstddef>
#include <cstdint>
#include <string_view>

#include "platform/clock.h"
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

// Hands on so many lines a minute and no more, so that nobody fills a disk who comes, is logged and goes again and
// again; then says how many were left out. What a program says at its very end is not written through this.
class BoundedLines final : public LineSink {
 public:
  static constexpr std::size_t mostInAMinute = 1000;

  // Both outlive it.
  BoundedLines(LineSink& sink, const Clock& clock) : sink_(sink), clock_(clock) {}
  ~BoundedLines() override { tellLeftOut(); }
  BoundedLines(const BoundedLines&) = delete;
  BoundedLines& operator=(const BoundedLines&) = delete;

  void line(std::string_view text) override;

 private:
  void tellLeftOut();

  LineSink& sink_;
  const Clock& clock_;
  std::chrono::nanoseconds minuteBegan_{};
  std::size_t lines_ = 0;
  std::uint64_t leftOut_ = 0;
};

// The name of a level as it stands on the command line and in the log.
std::string_view nameOf(LogLevel level);

// Whether what has now happened so many times is worth a line: the first, the second, the fourth … time, so that
// whoever does nothing else cannot fill the log.
constexpr bool isWorthTelling(std::uint64_t times) { return std::has_single_bit(times); }

}  // namespace probeview
