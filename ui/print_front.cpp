// SPDX-License-Identifier: Apache-2.0
#include "ui/print_front.h"

#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <ostream>

#include "platform/console_log.h"
#include "ui/page_snapshot.h"
#include "values/plain_text.h"

namespace probeview {

int PrintFront::run(NavigationStack& navigation, const StatusSource& status) {
  // Who asks for text is not to wait for a service that is not there.
  if (hasFailed()) return 1;
  if (isFilled_) {
    // Nothing else may wake the loop when the last that is waited for is silence.
    const auto wake = loop_.every(std::chrono::milliseconds(200), [] {});
    loop_.runUntil(isFilled_, patience);
    if (hasFailed()) return 1;
  }
  awaitLogsAt(fileDescriptor_);
  const bool onePage = navigation.depth() > 1;
  if (onePage ? printTopPage(navigation) : printBelow(navigation)) write(status().text + "\n");
  // A reader that has gone away has seen enough.
  if (trouble_ == 0 || trouble_ == EPIPE) return 0;
  if (errors_ != nullptr) *errors_ << "the pages could not be written: " << std::strerror(trouble_) << "\n";
  return 1;
}

bool PrintFront::hasFailed() const {
  const std::string reason = failure_ ? failure_() : std::string();
  if (reason.empty()) return false;
  // It is the last word also where the logs go to the same place.
  drainLogs(logsEndTime);
  *errors_ << onOneLine(reason) << "\n";
  return true;
}

bool PrintFront::printTopPage(const NavigationStack& navigation) {
  return write(navigationPath(navigation) + "\n" + plainText(takeSnapshot(navigation.topPage())) + "\n");
}

bool PrintFront::printBelow(NavigationStack& navigation) {
  const auto technologies = takeSnapshot(navigation.topPage());
  bool isRead = true;
  for (const auto& technology : technologies.sections.front().rows) {
    navigation.tap(technology);
    const auto categories = takeSnapshot(navigation.topPage());
    for (const auto& category : categories.sections.front().rows) {
      navigation.tap(category);
      isRead = printTopPage(navigation);
      navigation.pop();
      if (!isRead) break;
    }
    navigation.pop();
    if (!isRead) break;
  }
  return isRead;
}

bool PrintFront::write(std::string_view text) {
  while (!text.empty()) {
    const auto written = ::write(fileDescriptor_, text.data(), text.size());
    if (written < 0 && errno == EINTR) continue;
    if (written < 0) {
      trouble_ = errno;
      return false;
    }
    text.remove_prefix(static_cast<std::size_t>(written));
  }
  return true;
}

}  // namespace probeview
