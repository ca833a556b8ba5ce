// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <string_view>

#include "values/line_sink.h"

namespace probeview {

// Writes lines to a file descriptor: one write for each line, one for all lines of a group. What is held back is
// written when the log is destroyed and when the program stops through fatalError(). A reader that has gone away (a
// closed pipe) silences the log and disturbs nobody else. What finds no room on a full disk is lost, and what comes
// when there is room again is written. Main thread.
class ConsoleLog final : public LineSink {
 public:
  // The descriptor stays the caller's and must outlive the log.
  explicit ConsoleLog(int fileDescriptor);
  ~ConsoleLog() override;
  ConsoleLog(const ConsoleLog&) = delete;
  ConsoleLog& operator=(const ConsoleLog&) = delete;

  void line(std::string_view text) override;
  void beginGroup() override { ++openGroups_; }
  void endGroup() override;

  // Writes what is held back.
  void flush();
  // Whether nobody reads any more.
  bool closed() const { return closed_; }

 private:
  int fileDescriptor_;
  int openGroups_ = 0;
  bool closed_ = false;
  bool torn_ = false;  // the last line that is there has no end
  std::string held_;
};

// Where the store and the start-up write their lines: standard output, unless a program chose another sink.
LineSink& consoleLog();
// The sink must live as long as the process. Main thread, at start-up.
void setConsoleLog(LineSink& sink);

}  // namespace probeview
