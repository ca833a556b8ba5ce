// SPDX-License-Identifier: Apache-2.0
//
// The metric configuration that a client pushes: readable text (TOML) that says which metrics it wants and how often.
//
//   [metrics]                            # by name or by identifier; nothing else is reported
//   K_LTE_RRC_STATE = "on change"
//   K_LTE_RSRP_RSRQ_SINR = 1000          # a period in milliseconds, 1 to 86400000
//   0x3C40C2 = 5000
//
//   [triggers]                           # which metrics answer a query for a trigger
//   0x7F0013 = ["K_SIM_FILE_INFO"]
//
// An empty text is valid and wants no metric at all. A metric, section or key that nobody knows is noted and ignored,
// so that an older service takes a newer file; what cannot be meant (not TOML, a period of "often", a metric named
// twice, a text of unknown sections alone) is refused with its line and column.
#pragma once

#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "source/metric_source.h"

namespace probeview {

struct Configuration {
  MetricPlan plan;
  // Trigger identifier, such as 0x7F0013, to the metrics that answer it, in the order of the file.
  std::map<std::int64_t, std::vector<std::int64_t>> triggers;
  // What was ignored, each with its line; for the log.
  std::vector<std::string> notes;
};

struct ConfigurationResult {
  std::optional<Configuration> configuration;
  // Why there is none, with line and column in the text; both also as numbers, counted from 1.
  std::string error;
  std::uint32_t line = 0;
  std::uint32_t column = 0;
};

// Any bytes may come in; nothing is thrown. Any thread.
ConfigurationResult parseConfiguration(std::string_view text);

}  // namespace probeview
