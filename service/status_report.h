// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "values/dictionary.h"

namespace probeview {

class Service;

// What the service says of itself. Keys: "service", "uptime_ms", "base_configuration" (whether there is one),
// "configured_metrics" (how many; absent while nobody has configured any), "sources" and "clients", both lists.
// A source: "origin", "metrics" (how many it can fill), "metric_ids" (which), "records", "records_per_second",
// "withheld", "last_record_ms" (since 1970, absent before the first), "failure" (absent while it runs). A client:
// "number", "name", "process", "user", "connected_since_ms", "listening", "configured", "records",
// "records_per_second", "queued", "lost".
class StatusReport {
 public:
  static Dictionary of(const Service& service);
};

}  // namespace probeview
