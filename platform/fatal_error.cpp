// SPDX-License-Identifier: Apache-2.0
#include "platform/fatal_error.h"

#include <poll.h>
#include <signal.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <cstdint>
#include <cstdlib>
#include <string>
#include <utility>
#include <vector>

#include "platform/log_writer.h"
#include "values/plain_text.h"

namespace probeview {

namespace {

// Never destroyed: a stop may come while the process is already ending.
std::vector<std::function<void()>>& flushes() {
  static auto* all = new std::vector<std::function<void()>>;
  return *all;
}

std::function<void(std::string_view)>& observer() {
  static auto* one = new std::function<void(std::string_view)>;
  return *one;
}

// Writes to standard error if somebody takes it within the time given.
void writeLastLine(std::string_view text, std::chrono::nanoseconds atMost) {
  const auto milliseconds = std::chrono::duration_cast<std::chrono::milliseconds>(atMost).count();
  pollfd ready{STDERR_FILENO, POLLOUT, 0};
  if (::poll(&ready, 1, static_cast<int>(std::max<std::int64_t>(milliseconds, 0))) <= 0) return;
  // Another process may fill what was free just now; then the alarm ends this one.
  ::signal(SIGALRM, SIG_DFL);
  sigset_t alarms;
  sigemptyset(&alarms);
  sigaddset(&alarms, SIGALRM);
  ::pthread_sigmask(SIG_UNBLOCK, &alarms, nullptr);
  ::alarm(1);
  // Nothing can be done about a standard error that is closed.
  [[maybe_unused]] const ssize_t written = ::write(STDERR_FILENO, text.data(), text.size());
  ::alarm(0);
}

}  // namespace

void setFatalErrorObserver(std::function<void(std::string_view reason)> newObserver) {
  observer() = std::move(newObserver);
}

void addFatalErrorFlush(std::function<void()> flush) { flushes().push_back(std::move(flush)); }

void fatalError(std::string_view reason) {
  for (const auto& flush : flushes()) flush();
  const auto deadline = std::chrono::steady_clock::now() + logsEndTime;
  drainLogs(logsEndTime);
  if (observer()) observer()(reason);
  std::string text = "probeview: stopped: ";
  appendOnOneLine(reason, text);
  text += '\n';
  writeLastLine(text, deadline - std::chrono::steady_clock::now());
  std::abort();
}

}  // namespace probeview
