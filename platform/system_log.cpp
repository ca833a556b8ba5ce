// SPDX-License-Identifier: Apache-2.0
#include "platform/system_log.h"

#include <syslog.h>
#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <climits>
#include <string>
#include <utility>

#include "values/plain_text.h"

namespace probeview {

namespace {

constexpr char lossPrefix[] = "probeview: warning: ";

std::atomic<LineSink*>& chosenSystemSink() {
  static std::atomic<LineSink*> sink{nullptr};
  return sink;
}

SystemLog::Logger systemLogger(const char* identity) {
  ::openlog(identity, LOG_PID, LOG_USER);
  return [](std::string_view text) {
    const int size = static_cast<int>(std::min<std::size_t>(text.size(), INT_MAX));
    ::syslog(LOG_NOTICE, "%.*s", size, text.data());
  };
}

}  // namespace

SystemLog::SystemLog(const char* identity, Echo echo) : SystemLog(systemLogger(identity), echo) {}

SystemLog::SystemLog(Logger logger, Echo echo)
    : toLogger_({.label = "system log", .prefix = lossPrefix, .mostBytes = mostBytes, .gathers = false},
                [give = std::move(logger)](std::string_view text) {
                  give(text);
                  return LogWriter::Outcome::Taken;
                }) {
  if (echo == Echo::None) return;
  toStandardError_ = std::make_unique<LogWriter>(
      LogWriter::Settings{.label = "log echo", .prefix = lossPrefix, .mostBytes = mostBytes},
      writeToDescriptor(STDERR_FILENO));
}

void SystemLog::line(std::string_view text) {
  std::string line = onOneLine(text);
  toLogger_.append(line);
  if (!toStandardError_) return;
  // One entry, so that no other process's line comes in between.
  line += '\n';
  toStandardError_->append(line);
}

LineSink& systemLog() {
  if (LineSink* sink = chosenSystemSink().load(std::memory_order_acquire)) return *sink;
  static auto* log = new SystemLog("probeview");
  return *log;
}

void setSystemLog(LineSink& sink) { chosenSystemSink().store(&sink, std::memory_order_release); }

}  // namespace probeview
