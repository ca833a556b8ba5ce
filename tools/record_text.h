// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "platform/timestamp_formatter.h"
#include "values/dictionary.h"

namespace probeview {

// Shows metric events of the service, each as one line.
class RecordText {
 public:
  struct Options {
    bool json = false;
    bool personal = false;  // shows personal data, too
  };

  explicit RecordText(Options options) : options_(options) {}

  // For a person: time, origin, metric, dictionary; or the JSON object {"time","origin","metric","id","dict"}, with the
  // time in milliseconds since 1970-01-01 UTC. The dictionary of a metric without a message class is empty (null).
  std::string line(const Dictionary& event);

 private:
  Options options_;
  TimestampFormatter timestamps_;
};

// The identifier of a metric named on a command line, by its name or its identifier (decimal or 0x…).
std::optional<std::int64_t> metricOnCommandLine(std::string_view text);

}  // namespace probeview
