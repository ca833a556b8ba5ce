// SPDX-License-Identifier: Apache-2.0
#include "platform/fatal_error.h"

#include <unistd.h>

#include <cstdlib>
#include <string>
#include <utility>
#include <vector>

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

}  // namespace

void setFatalErrorObserver(std::function<void(std::string_view reason)> newObserver) {
  observer() = std::move(newObserver);
}

void addFatalErrorFlush(std::function<void()> flush) { flushes().push_back(std::move(flush)); }

void fatalError(std::string_view reason) {
  for (const auto& flush : flushes()) flush();
  if (observer()) observer()(reason);
  std::string text = "probeview: stopped: ";
  appendOnOneLine(reason, text);
  text += '\n';
  // Nothing can be done about a standard error that is closed.
  [[maybe_unused]] const ssize_t written = ::write(STDERR_FILENO, text.data(), text.size());
  std::abort();
}

}  // namespace probeview
