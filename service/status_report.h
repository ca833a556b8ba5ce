// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "values/dictionary.h"

namespace probeview {

class Service;

// What the service says of itself. Keys: "service", "uptime_ms", "base_configuration" (whether there is one),
// "configured_metrics" (how many; absent while nobody has configured any), "sources" and "clients", both lists.
// A source: "origin", "metrics" (how many it can fill), "metric_ids" (which), "records", "records_per_second",
// "withheld", "state" ("running", "ended" or "failed"), "failure" (why; absent unless it has failed), "rows_read" and
// "rows_skipped" (of a source that reads a file), "last_record_ms" (since 1970) and "last_record_age_ms" (by a clock
// that is never set), both absent before the first. A client: "number", "name", "process", "user",
// "connected_since_ms", "listening", "observes", "configured", "records", "records_per_second", "queued", "lost".
class StatusReport {
 public:
  static Dictionary of(const Service& service);
};

}  // namespace probeview
