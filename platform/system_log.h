// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <functional>
#include <memory>
#include <string_view>

#include "platform/log_writer.h"
#include "values/line_sink.h"

namespace probeview {

// The system's log (syslog, as a notice of a user's program), each line echoed to standard error, unless standard error
// belongs to somebody else. Each of the two has a thread of its own, and neither a logger that stands still nor a
// standard error that nobody reads keeps who logs: what finds no room is dropped and counted, and one line says how
// many when there is room again. Lines may come from any thread.
class SystemLog final : public LineSink {
 public:
  enum class Echo : bool { None, StandardError };
  // Gives one line to the system's logger; may take its time.
  using Logger = std::function<void(std::string_view text)>;
  // What waits for each of the two, all memory counted.
  static constexpr std::size_t mostBytes = 1024 * 1024;

  // The name that the lines bear in the system's log, which has one for the whole process; the last one made counts. It
  // must live as long as the process.
  explicit SystemLog(const char* identity, Echo echo = Echo::StandardError);
  // With a logger of the caller's.
  SystemLog(Logger logger, Echo echo);
  void line(std::string_view text) override;

 private:
  LogWriter toLogger_;
  std::unique_ptr<LogWriter> toStandardError_;  // none without an echo
};

// Where the client wrapper and the message decoder write their lines: the system's log under "probeview", unless a
// program chose another sink. Any thread.
LineSink& systemLog();
// The sink must live as long as the process and take lines from any thread. Main thread, at start-up.
void setSystemLog(LineSink& sink);

}  // namespace probeview
