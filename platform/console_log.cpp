// SPDX-License-Identifier: Apache-2.0
#include "platform/console_log.h"

#include <poll.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <csignal>
#include <vector>

#include "platform/fatal_error.h"
#include "values/plain_text.h"

namespace probeview {

namespace {

// The logs that live now; registered for the fatal stop as one, because a flush cannot be taken back.
std::vector<ConsoleLog*>& livingLogs() {
  static auto* logs = [] {
    addFatalErrorFlush([] {
      for (ConsoleLog* log : livingLogs()) log->flush();
    });
    // A write to a closed pipe or beyond what a file may have must report an error, not end the process.
    std::signal(SIGPIPE, SIG_IGN);
    std::signal(SIGXFSZ, SIG_IGN);
    return new std::vector<ConsoleLog*>;
  }();
  return *logs;
}

// What is left of the text when no more of it can be written; then errno says why.
std::string_view writeAll(int fileDescriptor, std::string_view text) {
  while (!text.empty()) {
    const ssize_t written = ::write(fileDescriptor, text.data(), text.size());
    if (written >= 0) {
      text.remove_prefix(static_cast<std::size_t>(written));
    } else if (errno == EAGAIN) {
      // Somebody else made the descriptor non-blocking; a log line is not to be lost for that.
      pollfd ready{fileDescriptor, POLLOUT, 0};
      if (::poll(&ready, 1, -1) < 0 && errno != EINTR) return text;
    } else if (errno != EINTR) {
      return text;
    }
  }
  return text;
}

// No room, now: of the disk, of what the user may have on it, or of what a file may have.
bool isShortage(int error) { return error == ENOSPC || error == EDQUOT || error == EFBIG; }

LineSink*& chosenSink() {
  static LineSink* sink = nullptr;
  return sink;
}

}  // namespace

ConsoleLog::ConsoleLog(int fileDescriptor) : fileDescriptor_(fileDescriptor) { livingLogs().push_back(this); }

ConsoleLog::~ConsoleLog() {
  flush();
  std::erase(livingLogs(), this);
}

void ConsoleLog::line(std::string_view text) {
  if (closed_) return;
  appendOnOneLine(text, held_);
  held_ += '\n';
  if (openGroups_ == 0) flush();
}

void ConsoleLog::endGroup() {
  if (openGroups_ > 0) --openGroups_;
  if (openGroups_ == 0) flush();
}

void ConsoleLog::flush() {
  if (held_.empty()) return;
  if (!closed_) {
    // A line that a full disk has cut is ended first, so that it stays one line.
    if (torn_) held_.insert(0, 1, '\n');
    const std::string_view left = writeAll(fileDescriptor_, held_);
    if (!left.empty() && !isShortage(errno)) closed_ = true;
    if (left.size() < held_.size()) torn_ = held_[held_.size() - left.size() - 1] != '\n';
  }
  held_.clear();
}

LineSink& consoleLog() {
  if (chosenSink() != nullptr) return *chosenSink();
  static auto* standardOutput = new ConsoleLog(STDOUT_FILENO);
  return *standardOutput;
}

void setConsoleLog(LineSink& sink) { chosenSink() = &sink; }

}  // namespace probeview
