// SPDX-License-Identifier: Apache-2.0
//
// Frames as tests say them, in one expression each.
#pragma once

#include <chrono>
#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "radix/frames.h"

namespace radix {

// The greeting of a client that observes.
inline Hello observer(std::string_view name) {
  Hello hello(name);
  hello.setObserves(true);
  return hello;
}

// The greeting of a service that does not talk to its client.
inline Hello refusing(std::int32_t status, std::string_view reason, std::string_view name = "refusing") {
  Hello hello(name);
  hello.setRefusalStatus(status);
  hello.setRefusal(reason);
  return hello;
}

struct MetricEventParts {
  std::int64_t metricId = 1;
  std::vector<std::uint8_t> payload{};
  std::int64_t time = 0;
  std::string origin{};
  std::optional<std::chrono::milliseconds> period{};
};

inline Event metricEvent(const MetricEventParts& parts = {}) {
  Event event(EventKind::Metric);
  event.setMetricId(unsignedOf(parts.metricId));
  event.setPayload(parts.payload);
  event.setTime(unsignedOf(parts.time));
  event.setOrigin(parts.origin);
  if (parts.period) event.setPeriod(unsignedOf(parts.period->count()));
  return event;
}

// The event's frame, and behind it the age of its record.
inline std::vector<std::uint8_t> agedFrame(const Event& event, std::chrono::nanoseconds age) {
  std::vector<std::uint8_t> bytes = *encode(event);
  const Trailer trailer = ageTrailer(age);
  bytes.insert(bytes.end(), trailer.bytes.begin(), trailer.bytes.begin() + trailer.size);
  return bytes;
}

// To compare with.
inline std::vector<std::uint8_t> copyOf(std::span<const std::uint8_t> bytes) { return {bytes.begin(), bytes.end()}; }

}  // namespace radix
