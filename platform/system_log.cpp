// SPDX-License-Identifier: Apache-2.0
#include "platform/system_log.h"

#include <sys/uio.h>
#include <syslog.h>
#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <climits>
#include <csignal>
#include <string>

#include "values/plain_text.h"

namespace probeview {

namespace {

std::atomic<LineSink*>& chosenSink() {
  static std::atomic<LineSink*> sink{nullptr};
  return sink;
}

}  // namespace

SystemLog::SystemLog(const char* identity, Echo echo) : echo_(echo) {
  ::openlog(identity, LOG_PID, LOG_USER);
  // A closed standard error must not end the process.
  std::signal(SIGPIPE, SIG_IGN);
}

void SystemLog::line(std::string_view text) {
  const std::string shown = onOneLine(text);
  text = shown;
  const int size = static_cast<int>(std::min<std::size_t>(text.size(), INT_MAX));
  ::syslog(LOG_NOTICE, "%.*s", size, text.data());
  if (echo_ == Echo::None) return;
  char lineEnd = '\n';
  const iovec parts[] = {{const_cast<char*>(text.data()), text.size()}, {&lineEnd, 1}};
  // Nothing can be done about a standard error that nobody reads.
  [[maybe_unused]] const ssize_t written = ::writev(STDERR_FILENO, parts, 2);
}

LineSink& systemLog() {
  if (LineSink* sink = chosenSink().load(std::memory_order_acquire)) return *sink;
  static auto* log = new SystemLog("probeview");
  return *log;
}

void setSystemLog(LineSink& sink) { chosenSink().store(&sink, std::memory_order_release); }

}  // namespace probeview
