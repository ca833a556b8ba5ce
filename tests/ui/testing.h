// SPDX-License-Identifier: Apache-2.0
//
// What the tests of the pages share: a store that can be filled by hand, a log that remembers, stops that are observed.
#pragma once

#include <gtest/gtest.h>

#include <functional>
#include <map>
#include <optional>
#include <string>
#include <vector>

#include "platform/fatal_error.h"
#include "platform/manual_loop.h"
#include "store/metric_validator.h"
#include "ui/interface_description.h"
#include "ui/page_environment.h"

namespace probeview::testing_ui {

class RememberedLines final : public LineSink {
 public:
  void line(std::string_view text) override { lines.emplace_back(text); }
  std::vector<std::string> lines;
};

// A store with no service behind it whose display dictionaries tests fill by hand.
class HandFilledStore final : public MetricValidator {
 public:
  HandFilledStore(LineSink& console, LineSink& systemLog)
      : MetricValidator(Surroundings{.wrapper = nullptr, .console = console, .systemLog = systemLog}) {}

  std::map<DisplayDictionary, std::optional<Dictionary>> filled;

  const std::optional<Dictionary>& displayDictionary(DisplayDictionary which) const override {
    const auto found = filled.find(which);
    return found == filled.end() ? MetricValidator::displayDictionary(which) : found->second;
  }
};

struct Stop {
  std::string reason;
};

// The reason for which the action stops the program; absent when it does not.
inline std::optional<std::string> stopReason(const std::function<void()>& action) {
  setFatalErrorObserver([](std::string_view reason) { throw Stop{std::string(reason)}; });
  std::optional<std::string> reason;
  try {
    action();
  } catch (const Stop& stop) {
    reason = stop.reason;
  }
  setFatalErrorObserver({});
  return reason;
}

// A main queue with a clock, a log and a store of its own.
class PagesTest : public testing::Test {
 protected:
  ManualLoop loop;
  RememberedLines console;
  RememberedLines systemLog;
  HandFilledStore store{console, systemLog};
  const PageEnvironment environment{loop, loop, console, store};
  const InterfaceDescription description{environment};
};

}  // namespace probeview::testing_ui
