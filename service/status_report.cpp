// SPDX-License-Identifier: Apache-2.0
#include "service/status_report.h"

#include <chrono>
#include <utility>

#include "service/service.h"

namespace probeview {

namespace {

Value count(std::uint64_t number) { return number; }
Value milliseconds(std::chrono::nanoseconds time) {
  return std::int64_t{std::chrono::duration_cast<std::chrono::milliseconds>(time).count()};
}

std::string_view nameOf(SourceCondition::Phase phase) {
  switch (phase) {
    case SourceCondition::Phase::Running:
      return "running";
    case SourceCondition::Phase::Ended:
      return "ended";
    case SourceCondition::Phase::Failed:
      return "failed";
  }
  return {};
}

Dictionary describe(const SourceSlot& source) {
  List identifiers;
  for (const std::int64_t metric : source.metrics()) identifiers.append(metric);
  Dictionary entry{{"origin", Value::text(source.origin())},
                   {"metrics", count(source.metrics().size())},
                   {"metric_ids", std::move(identifiers)},
                   {"records", count(source.records())},
                   {"records_per_second", source.recordsPerSecond()},
                   {"withheld", count(source.withheld())}};
  const SourceCondition condition = source.condition();
  entry.append("state", Value::text(nameOf(condition.phase)));
  if (condition.phase == SourceCondition::Phase::Failed) entry.append("failure", Value::text(condition.reason));
  if (const auto intake = source.intake()) {
    entry.append("rows_read", count(intake->rowsRead));
    entry.append("rows_skipped", count(intake->rowsSkipped));
  }
  if (source.lastRecord()) {
    entry.append("last_record_ms", milliseconds(*source.lastRecord()));
    entry.append("last_record_age_ms", milliseconds(source.lastRecordAge()));
  }
  return entry;
}

Dictionary describe(const Session& client) {
  return {{"number", count(client.number())},
          {"name", Value::text(client.clientName())},
          {"process", std::int64_t{client.peer().process}},
          {"user", std::int64_t{client.peer().user}},
          {"connected_since_ms", milliseconds(client.connectedSince())},
          {"listening", client.isListening()},
          {"observes", client.observes()},
          {"configured", client.configuration().has_value()},
          {"records", count(client.outbox().sentRecords())},
          {"records_per_second", client.recordsPerSecond()},
          {"queued", count(client.outbox().records())},
          {"lost", count(client.outbox().lostRecords())}};
}

}  // namespace

Dictionary StatusReport::of(const Service& service) {
  List sources;
  for (const auto& source : service.sources_) sources.append(describe(*source));
  List clients;
  for (const auto& session : service.sessions_) {
    if (session->isActive()) clients.append(describe(*session));
  }
  Dictionary report{{"service", Value::text(service.settings_.name)},
                    {"uptime_ms", milliseconds(service.worker_.clock().monotonicTime() - service.started_)},
                    {"base_configuration", service.baseConfiguration_.has_value()}};
  if (service.plan_) report.append("configured_metrics", count(service.plan_->metrics.size()));
  report.append("sources", std::move(sources));
  report.append("clients", std::move(clients));
  return report;
}

}  // namespace probeview
