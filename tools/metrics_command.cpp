// SPDX-License-Identifier: Apache-2.0
#include "tools/metrics_command.h"

#include <algorithm>
#include <memory>
#include <ostream>
#include <string>
#include <vector>

#include "messages/metric_identifiers.h"
#include "schema/field_text.h"
#include "schema/pages.h"
#include "tools/names.h"
#include "values/json.h"
#include "values/plain_text.h"

namespace probeview {

namespace {

struct MetricsOptions {
  std::vector<std::string> metrics;
  bool json = false;
};

constexpr std::string_view withoutClass = "known, but nothing takes it: it has no message class";

std::string explanation(const MessageDescriptor& message, const FieldDescriptor& field) {
  std::string text = meaningText(message, field);
  const std::string viewer = viewerText(message, field);
  if (!viewer.empty()) text += "; in the viewer " + viewer;
  return text;
}

// A line for each field, those of nested messages below, indented.
void appendFields(const MessageDescriptor& message, std::size_t indent, std::string& out) {
  std::size_t nameWidth = 0;
  std::size_t typeWidth = 0;
  for (const FieldDescriptor& field : message.fields()) {
    nameWidth = std::max(nameWidth, field.name.size());
    typeWidth = std::max(typeWidth, publishedType(message, field).size());
  }
  for (const FieldDescriptor& field : message.fields()) {
    const std::string type = publishedType(message, field);
    out.append(indent, ' ');
    out += field.name;
    out.append(nameWidth - field.name.size() + 2, ' ');
    out += type;
    out.append(typeWidth - type.size() + 2, ' ');
    out += explanation(message, field) + '\n';
    if (field.element != nullptr) appendFields(*field.element, indent + 2, out);
  }
}

std::string explained(const MetricIdentifier& metric, bool withFields) {
  std::string out(metric.name);
  out += "  " + hexText(metric.id) + "  ";
  if (metric.message == nullptr) return out + "no message\n  " + std::string(withoutClass) + "\n";
  out += std::string(metric.message->name) + '\n';
  const MessageMeaning& meaning = metric.message->meaning;
  out += "  " + std::string(meaning.text) + '\n';
  if (!meaning.pages.empty()) out += "  pages: " + std::string(meaning.pages) + '\n';
  if (withFields) appendFields(*metric.message, 2, out);
  return out;
}

List fieldsOf(const MessageDescriptor& message) {
  List fields;
  for (const FieldDescriptor& field : message.fields()) {
    Dictionary entry{{"key", Value::constant(field.name)},
                     {"number", std::uint32_t{field.number}},
                     {"type", Value::text(publishedType(message, field))},
                     {"meaning", Value::text(meaningText(message, field))},
                     {"viewer", Value::text(viewerText(message, field))}};
    if (field.enumeration != nullptr) {
      List names;
      for (const EnumerationEntry& each : field.enumeration->entries()) {
        names.append(Dictionary{{"value", std::int64_t{each.value}}, {"name", Value::constant(each.name)}});
      }
      entry.append("values", std::move(names));
    }
    if (field.element != nullptr) entry.append("fields", fieldsOf(*field.element));
    fields.append(std::move(entry));
  }
  return fields;
}

Dictionary asDictionary(const MetricIdentifier& metric) {
  Dictionary entry{{"metric", Value::constant(metric.name)}, {"id", metric.id}};
  if (metric.message == nullptr) {
    entry.append("meaning", Value::constant(withoutClass));
    return entry;
  }
  entry.append("message", Value::constant(metric.message->name));
  entry.append("meaning", Value::constant(metric.message->meaning.text));
  entry.append("pages", Value::constant(metric.message->meaning.pages));
  entry.append("fields", fieldsOf(*metric.message));
  return entry;
}

ExitStatus showMetrics(const MetricsOptions& options, Tool& tool) {
  std::vector<const MetricIdentifier*> shown;
  for (const std::string& text : options.metrics) {
    const MetricIdentifier* const metric = metricReferredTo(text);
    if (metric == nullptr) {
      tool.errors << "probectl: " << unknownMetric(text) << '\n';
      return ExitStatus::UsageError;
    }
    shown.push_back(metric);
  }
  const bool all = shown.empty();
  if (all) {
    for (const MetricIdentifier& metric : metricIdentifiers()) shown.push_back(&metric);
  }
  for (const MetricIdentifier* metric : shown) {
    std::string text;
    if (options.json) {
      appendJson(asDictionary(*metric), text);
      text += '\n';
    } else {
      text = explained(*metric, !all);
    }
    tool.output << text;
  }
  return ExitStatus::Success;
}

}  // namespace

void addMetricsCommand(Command program, Tool& tool) {
  Command command = program.subcommand("metrics", "List and explain the metrics that there are");
  auto options = std::make_shared<MetricsOptions>();
  command.option("METRIC", options->metrics, "Those alone, with their fields; by name or identifier (decimal or 0x…)");
  command.flag("--json", options->json, "One JSON object a line for each metric, always with its fields");
  command.footer(
      "Without METRIC each metric with its identifier, its message, what it tells and the pages that show it. No\n"
      "service is asked; 'probectl status' says what its sources can fill.\n"
      "\n"
      "With --json: "
      "{\"metric\":…,\"id\":…,\"message\":…,\"meaning\":…,\"pages\":…,\"fields\":[{\"key\":…,\"number\":…,\n"
      "\"type\":…,\"meaning\":…,\"viewer\":…}]}; an enumeration has \"values\", a nested message \"fields\" of its "
      "own.\n"
      "\n"
      "Examples:\n"
      "  probectl metrics\n"
      "  probectl metrics K_LTE_RRC_STATE\n"
      "  probectl metrics --json | jq -r 'select(.fields[]?.key == \"phy_cell_id\") | .metric'");
  command.whenChosen([options, &tool] { tool.run = [options, &tool] { return showMetrics(*options, tool); }; });
}

}  // namespace probeview
