// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string_view>

#include "values/line_sink.h"

namespace probeview {

// The system's log (syslog, as a notice of a user's program), each line echoed to standard error with one write, unless
// standard error belongs to somebody else. Lines may come from any thread.
class SystemLog final : public LineSink {
 public:
  enum class Echo : bool { None, StandardError };
  // The name that the lines bear in the system's log, which has one for the whole process; the last one made counts. It
  // must live as long as the process.
  explicit SystemLog(const char* identity, Echo echo = Echo::StandardError);
  void line(std::string_view text) override;

 private:
  const Echo echo_;
};

// Where the client wrapper and the message decoder write their lines: the system's log under "probeview", unless a
// program chose another sink. Any thread.
LineSink& systemLog();
// The sink must live as long as the process and take lines from any thread. Main thread, at start-up.
void setSystemLog(LineSink& sink);

}  // namespace probeview
