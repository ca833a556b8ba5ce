// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <map>
#include <utility>

#include "radix/client.h"
#include "radix/link.h"

namespace probeview {

// The last record of each metric, in the order in which they came, so that a new client is not blank. Each has a number
// of its own, by which sessions know what they have sent.
class LastRecords {
 public:
  struct Record {
    std::int64_t metricId;
    radix::FrameBytes frame;
    std::chrono::nanoseconds born{};  // when its values were new, by Clock::ageTime()
  };

  // The record's number, from 1; 0 when it is not kept.
  std::uint64_t keep(Record record) {
    if (const auto known = arrivals_.find(record.metricId); known != arrivals_.end()) {
      // The place of the one before is used again.
      auto place = records_.extract(known->second);
      place.key() = known->second = ++arrived_;
      place.mapped() = std::move(record);
      records_.insert(records_.end(), std::move(place));
    } else if (arrivals_.size() < radix::mostMetrics) {
      arrivals_.emplace(record.metricId, ++arrived_);
      records_.emplace_hint(records_.end(), arrived_, std::move(record));
    } else {
      return 0;
    }
    return arrived_;
  }

  // By arrival, the oldest first.
  const std::map<std::uint64_t, Record>& records() const { return records_; }

 private:
  std::map<std::uint64_t, Record> records_;
  std::map<std::int64_t, std::uint64_t> arrivals_;
  std::uint64_t arrived_ = 0;
};

}  // namespace probeview
