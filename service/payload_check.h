// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <span>
#include <string>

namespace probeview {

// Whether the payload decodes with the message class of its metric. A metric that has no message class cannot be judged
// and passes: whoever takes it knows that it is unknown.
bool payloadDecodes(std::int64_t metricId, std::span<const std::uint8_t> payload);

// For people: "K_LTE_RRC_STATE (0x3C4E04)", or the bare number of a metric without a name.
std::string metricText(std::int64_t metricId);

}  // namespace probeview
