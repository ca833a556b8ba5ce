// SPDX-License-Identifier: Apache-2.0
#include "platform/console_log.h"

#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <vector>

#include "platform/fatal_error.h"
#include "values/plain_text.h"

namespace probeview {

namespace {

// The logs that live now; registered for the fatal stop as one, because a flush cannot be taken back.
std::vector<ConsoleLog*>& livingConsoleLogs() {
  static auto* logs = new std::vector<ConsoleLog*>;
  return *logs;
}

LineSink*& chosenConsoleSink() {
  static LineSink* sink = nullptr;
  return sink;
}

bool isRegularFile(int fileDescriptor) {
  struct stat status;
  return ::fstat(fileDescriptor, &status) == 0 && S_ISREG(status.st_mode);
}

bool isSamePlace(int left, int right) {
  if (left == right) return true;
  struct stat one;
  struct stat other;
  return ::fstat(left, &one) == 0 && ::fstat(right, &other) == 0 && one.st_dev == other.st_dev &&
         one.st_ino == other.st_ino;
}

}  // namespace

ConsoleLog::ConsoleLog(int fileDescriptor, const Settings& settings)
    : fileDescriptor_(fileDescriptor),
      writer_({.label = "console log",
               .prefix = settings.prefix,
               .mostBytes = settings.mostBytes,
               .patience = isRegularFile(fileDescriptor) ? LogWriter::unlimitedPatience : settings.patience},
              writeToDescriptor(fileDescriptor)) {
  [[maybe_unused]] static const bool registered = [] {
    addFatalErrorFlush([] {
      for (ConsoleLog* log : livingConsoleLogs()) log->release();
    });
    return true;
  }();
  livingConsoleLogs().push_back(this);
}

ConsoleLog::~ConsoleLog() {
  release();
  std::erase(livingConsoleLogs(), this);
}

void ConsoleLog::line(std::string_view text) {
  if (closed()) return;
  appendOnOneLine(text, held_);
  held_ += '\n';
  if (openGroups_ == 0) release();
}

void ConsoleLog::endGroup() {
  if (openGroups_ > 0) --openGroups_;
  if (openGroups_ == 0) release();
}

void ConsoleLog::release() {
  writer_.append(held_);
  held_.clear();
}

void ConsoleLog::flush() {
  release();
  writer_.drain(logsEndTime);
}

LineSink& consoleLog() {
  if (chosenConsoleSink() != nullptr) return *chosenConsoleSink();
  static auto* standardOutput = new ConsoleLog(STDOUT_FILENO);
  return *standardOutput;
}

void setConsoleLog(LineSink& sink) { chosenConsoleSink() = &sink; }

void awaitLogsAt(int fileDescriptor) {
  for (ConsoleLog* log : livingConsoleLogs()) {
    if (!isSamePlace(log->fileDescriptor_, fileDescriptor)) continue;
    log->release();
    log->writer_.drain(LogWriter::unlimitedPatience);
  }
}

}  // namespace probeview
