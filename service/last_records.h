// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstdint>
#include <map>

#include "radix/link.h"

namespace probeview {

// The last record of each metric, in the order in which they came, so that a new client is not blank.
class LastRecords {
 public:
  // More metrics than there are; a source that invents identifiers does not fill the memory.
  static constexpr std::size_t mostMetrics = 256;

  void keep(std::int64_t metricId, radix::FrameBytes frame) {
    if (const auto known = arrivals_.find(metricId); known != arrivals_.end()) {
      records_.erase(known->second);
      known->second = ++arrived_;
    } else if (arrivals_.size() < mostMetrics) {
      arrivals_.emplace(metricId, ++arrived_);
    } else {
      return;
    }
    records_.emplace_hint(records_.end(), arrived_, Record{metricId, std::move(frame)});
  }

  struct Record {
    std::int64_t metricId;
    radix::FrameBytes frame;
  };
  // By arrival, the oldest first.
  const std::map<std::uint64_t, Record>& records() const { return records_; }

 private:
  std::map<std::uint64_t, Record> records_;
  std::map<std::int64_t, std::uint64_t> arrivals_;
  std::uint64_t arrived_ = 0;
};

}  // namespace probeview
