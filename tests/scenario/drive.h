// SPDX-License-Identifier: Apache-2.0
//
// A scenario source on a loop that the test moves, and what it has reported.
#pragma once

#include <gtest/gtest.h>

#include <chrono>
#include <memory>
#include <set>
#include <string>
#include <string_view>
#include <vector>

#include "messages/metric_identifiers.h"
#include "messages/runtime/codable.h"
#include "messages/runtime/data_reader.h"
#include "messages/runtime/data_writer.h"
#include "platform/manual_loop.h"
#include "scenario/scenario_source.h"

namespace probeview {

inline bool operator==(const MetricRecord& left, const MetricRecord& right) {
  return left.metricId == right.metricId && left.payload == right.payload && left.time == right.time &&
         left.origin == right.origin;
}

class Drive final : public MetricSink, public LineSink {
 public:
  explicit Drive(std::string_view arguments) {
    SourceResult result = makeScenarioSource(arguments);
    EXPECT_EQ(result.error, "");
    source = std::move(result.source);
    source->start({loop, loop, *this}, *this);
  }
  ~Drive() override { source->stop(); }

  void listen() { source->setListening(true); }
  void forSeconds(double seconds) {
    loop.advance(std::chrono::milliseconds(static_cast<std::int64_t>(seconds * 1000)));
  }

  void emit(MetricRecord record) override { records.push_back(std::move(record)); }
  void line(std::string_view text) override { ADD_FAILURE() << text; }

  std::size_t count(std::int64_t metricId) const {
    std::size_t number = 0;
    for (const MetricRecord& record : records) number += record.metricId == metricId ? 1 : 0;
    return number;
  }
  std::set<std::int64_t> seen() const {
    std::set<std::int64_t> ids;
    for (const MetricRecord& record : records) ids.insert(record.metricId);
    return ids;
  }

  ManualLoop loop;
  std::vector<MetricRecord> records;
  std::unique_ptr<MetricSource> source;
};

// Metrics that the store handles and of which a made-up phone can know nothing; it says so by not filling them.
inline const std::set<std::int64_t> neverTold{};

// What every drive tells: all others that the store handles.
inline std::set<std::int64_t> toldMetrics() {
  std::set<std::int64_t> ids;
  for (const MetricIdentifier& metric : metricIdentifiers()) {
    if (metric.isHandled && !neverTold.contains(metric.id)) ids.insert(metric.id);
  }
  return ids;
}

inline std::string nameOf(std::int64_t metricId) {
  const MetricIdentifier* metric = metricWithId(metricId);
  return metric != nullptr ? std::string(metric->name) : "?";
}

template <typename Message>
Message decoded(const MetricRecord& record) {
  Message message;
  PBDataReader reader(record.payload);
  EXPECT_TRUE(message.readFrom(reader)) << nameOf(record.metricId);
  return message;
}

inline std::unique_ptr<PBCodable> decodedAny(const MetricRecord& record) {
  auto message = metricWithId(record.metricId)->message->make();
  PBDataReader reader(record.payload);
  EXPECT_TRUE(message->readFrom(reader)) << nameOf(record.metricId);
  return message;
}

}  // namespace probeview
