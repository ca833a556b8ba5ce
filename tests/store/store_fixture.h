// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <gtest/gtest.h>

#include <cstdint>
#include <limits>
#include <optional>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

#include "platform/fatal_error.h"
#include "platform/time_zone.h"
#include "store/metric_validator.h"
#include "tests/store/wire.h"
#include "values/line_sink.h"
#include "values/printer.h"

namespace probeview {

using Lines = std::vector<std::string>;

class CollectingSink final : public LineSink {
 public:
  void line(std::string_view text) override { lines.emplace_back(text); }
  void beginGroup() override { ++depth_; }
  void endGroup() override {
    if (--depth_ == 0) ++groups;
  }
  Lines lines;
  int groups = 0;

 private:
  int depth_ = 0;
};

// Turns fatal stops into exceptions while it lives.
class FatalStopsThrow {
 public:
  FatalStopsThrow() {
    setFatalErrorObserver([](std::string_view reason) { throw std::runtime_error(std::string(reason)); });
  }
  ~FatalStopsThrow() { setFatalErrorObserver({}); }
};

// The reason for which the work stops the program; absent when it does not.
template <typename Work>
std::optional<std::string> reasonOfStop(Work&& work) {
  const FatalStopsThrow stops;
  try {
    work();
  } catch (const std::runtime_error& stop) {
    return stop.what();
  }
  return std::nullopt;
}

inline Dictionary metricEvent(std::int64_t metricID, const Wire& payload) {
  return {{"kKeyMetricID", metricID}, {"kKeyPayload", Value::bytes(payload.payload())}};
}

// 2024-03-05 12:00:00.123 UTC, and how it reads.
inline constexpr std::uint64_t someTime = 1709640000123;
inline constexpr std::string_view someTimeText = "2024-03-05 12:00:00 UTC";

inline constexpr std::int32_t lowest = std::numeric_limits<std::int32_t>::min();

// A payload that begins with the time, which is field 1 of all metrics.
inline Wire timed(std::uint64_t time = someTime) { return Wire().varint(1, time); }

// A store that is fed directly.
class StoreTest : public testing::Test {
 protected:
  bool send(std::int64_t metricID, const Wire& payload) {
    return store_.metricsDidUpdate(metricEvent(metricID, payload));
  }
  // The lines of one event between its identifier and its end.
  Lines linesOf(std::int64_t metricID, const Wire& payload) {
    console_.lines.clear();
    EXPECT_TRUE(send(metricID, payload));
    Lines lines = console_.lines;
    EXPECT_GE(lines.size(), 2u);
    EXPECT_TRUE(lines.front().starts_with("Metric ID in Hex = "));
    EXPECT_EQ(lines.back(), "Received Valid Metric");
    return Lines(lines.begin() + 1, lines.end() - 1);
  }

  const FixedTimeZone utc_{0, "UTC"};
  CollectingSink console_;
  CollectingSink systemLog_;
  MetricValidator store_{{.console = console_, .systemLog = systemLog_, .timeZone = utc_}};
};

inline const std::string placeholder = R"([["Waiting for Update": "Waiting for Update"]])";

}  // namespace probeview
