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

}  // namespace probeview
