// SPDX-License-Identifier: Apache-2.0
#include "service/log.h"

#include <string>

#include "values/plain_text.h"

namespace probeview {

std::string_view nameOf(LogLevel level) {
  switch (level) {
    case LogLevel::Error:
      return "error";
    case LogLevel::Warning:
      return "warning";
    case LogLevel::Info:
      return "info";
    case LogLevel::Debug:
      return "debug";
  }
  return {};
}

void ServiceLog::write(LogLevel level, std::string_view text) {
  if (!takes(level)) return;
  std::string line = "radixd: ";
  line += nameOf(level);
  line += ": ";
  // What a peer or a file said may be quoted in the text: a line stays a line.
  line += onOneLine(text);
  sink_.line(line);
}

void BoundedLines::line(std::string_view text) {
  const std::chrono::nanoseconds now = clock_.monotonicTime();
  if (lines_ == 0 || now - minuteBegan_ >= std::chrono::minutes(1)) {
    tellLeftOut();
    minuteBegan_ = now;
    lines_ = 0;
  }
  if (lines_ == mostInAMinute) {
    ++leftOut_;
    return;
  }
  ++lines_;
  sink_.line(text);
}

void BoundedLines::tellLeftOut() {
  if (leftOut_ == 0) return;
  sink_.line("radixd: warning: " + std::to_string(leftOut_) + (leftOut_ == 1 ? " line was" : " lines were") +
             " left out here, as there were more than " + std::to_string(mostInAMinute) + " in a minute");
  leftOut_ = 0;
}

}  // namespace probeview
