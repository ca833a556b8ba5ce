// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "bench/road/events.h"

namespace probeview::bench {

// A service whose one source reports a stream at a steady rate, as soon and as long as somebody listens.
struct SteadyService {
  std::string socket;
  std::vector<MetricSample> stream;
  double perSecond = 1;
  std::uint64_t most = UINT64_MAX;  // records; the source falls silent after them

  // Serves until SIGTERM; the exit status. Each record's time is not the time of day but the monotonic time in
  // nanoseconds at which it was reported, so that latencies can be measured.
  int serve() const;
};

}  // namespace probeview::bench
