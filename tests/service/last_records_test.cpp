// SPDX-License-Identifier: Apache-2.0
#include "service/last_records.h"

#include <gtest/gtest.h>

#include <memory>
#include <vector>

namespace probeview {
namespace {

std::vector<std::int64_t> metricsOf(const LastRecords& records) {
  std::vector<std::int64_t> metrics;
  for (const auto& [arrival, record] : records.records()) metrics.push_back(record.metricId);
  return metrics;
}

TEST(LastRecords, KeepTheLastOfEachMetricInTheOrderOfArrival) {
  LastRecords records;
  const auto old = std::make_shared<const std::vector<std::uint8_t>>(1);
  const auto fresh = std::make_shared<const std::vector<std::uint8_t>>(2);
  EXPECT_EQ(records.keep({5, old}), 1U);
  EXPECT_EQ(records.keep({3, old}), 2U);
  EXPECT_EQ(records.keep({5, fresh}), 3U);
  EXPECT_EQ(metricsOf(records), (std::vector<std::int64_t>{3, 5}));
  EXPECT_EQ(records.records().rbegin()->second.frame, fresh);
}

TEST(LastRecords, KeepAsManyMetricsAsTheLimitSaysAndNotOneMore) {
  LastRecords records;
  const auto frame = std::make_shared<const std::vector<std::uint8_t>>(1);
  for (std::size_t metric = 0; metric < radix::mostMetrics; ++metric) {
    records.keep({static_cast<std::int64_t>(metric), frame});
  }
  EXPECT_EQ(records.records().size(), radix::mostMetrics);
  EXPECT_EQ(records.keep({-1, frame}), 0U);
  EXPECT_EQ(records.records().size(), radix::mostMetrics);
  records.keep({0, frame});
  EXPECT_EQ(metricsOf(records).back(), 0);
}

}  // namespace
}  // namespace probeview
