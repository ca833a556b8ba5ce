// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <string_view>

#include "platform/log_writer.h"
#include "values/line_sink.h"

namespace probeview {

// Writes lines to a file descriptor, in their order, on a thread of its own: whoever logs does not wait for who reads.
// A reader that is slower for a moment loses nothing; one that reads, but less than what comes, is waited for; one that
// takes nothing stops nobody: the lines that find no room are dropped and counted, and one line says how many when
// there is room again. A regular file loses nothing but what finds no room on a full disk; what comes when there is
// room again is written. A reader that has gone away (a closed pipe) silences the log and disturbs nobody else.
// The lines of a group stay together. What is held back is written when the log is destroyed, at the end of the process
// and when the program stops through fatalError(), for at most logsEndTime. Main thread.
class ConsoleLog final : public LineSink {
 public:
  struct Settings {
    // Of the line that tells a loss.
    std::string prefix = "probeview: warning: ";
    std::size_t mostBytes = 4 * 1024 * 1024;
    // See LogWriter::Settings; a regular file is always waited for.
    std::chrono::nanoseconds patience = std::chrono::milliseconds(250);
  };

  // The descriptor stays the caller's and must outlive the log.
  explicit ConsoleLog(int fileDescriptor) : ConsoleLog(fileDescriptor, Settings{}) {}
  ConsoleLog(int fileDescriptor, const Settings& settings);
  ~ConsoleLog() override;
  ConsoleLog(const ConsoleLog&) = delete;
  ConsoleLog& operator=(const ConsoleLog&) = delete;

  void line(std::string_view text) override;
  void beginGroup() override { ++openGroups_; }
  void endGroup() override;

  // Hands over what a group holds back and waits until all is written, for at most logsEndTime.
  void flush();
  // Whether nobody reads any more.
  bool closed() const { return writer_.closed(); }

 private:
  friend void awaitLogsAt(int fileDescriptor);

  void release();

  int fileDescriptor_;
  int openGroups_ = 0;
  std::string held_;
  LogWriter writer_;
};

// Where the store and the start-up write their lines: standard output, unless a program chose another sink.
LineSink& consoleLog();
// The sink must live as long as the process. Main thread, at start-up.
void setConsoleLog(LineSink& sink);

// For who writes an answer: waits until the console logs that go to the same place as the descriptor are written, as
// long as their reader takes for it, so that the answer comes after them. Main thread.
void awaitLogsAt(int fileDescriptor);

}  // namespace probeview
