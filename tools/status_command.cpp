// SPDX-License-Identifier: Apache-2.0
#include "tools/status_command.h"

#include <CLI/CLI.hpp>
#include <memory>
#include <ostream>
#include <string>
#include <string_view>

#include "radix/service_commands.h"
#include "tools/service_client.h"
#include "values/json.h"
#include "values/plain_text.h"
#include "values/printer.h"

namespace probeview {

namespace {

// Where a service says less than this program knows, it shows nothing.
std::string text(const Dictionary& entry, std::string_view key) {
  const Value* value = entry.find(key);
  if (value == nullptr) return "";
  // Names come from other programs: nothing in them may steer the terminal.
  return onOneLine(bareText(*value));
}

bool truth(const Dictionary& entry, std::string_view key) {
  const Value* value = entry.find(key);
  return value != nullptr && value->boolean().value_or(false);
}

std::string oneDecimal(double number) {
  // Without the process's locale, which may have a comma.
  const auto tenths = static_cast<std::int64_t>(number * 10 + (number < 0 ? -0.5 : 0.5));
  std::string shown = tenths < 0 ? "-" : "";
  const std::int64_t size = tenths < 0 ? -tenths : tenths;
  return shown + std::to_string(size / 10) + "." + std::to_string(size % 10);
}

std::string rate(const Dictionary& entry) {
  const Value* value = entry.find("records_per_second");
  return oneDecimal(value != nullptr ? value->real().value_or(0) : 0) + "/s";
}

std::string duration(std::int64_t milliseconds) {
  const std::int64_t seconds = milliseconds / 1000;
  if (seconds < 60) return oneDecimal(static_cast<double>(milliseconds) / 1000) + " s";
  if (seconds < 3600) return std::to_string(seconds / 60) + " min " + std::to_string(seconds % 60) + " s";
  return std::to_string(seconds / 3600) + " h " + std::to_string(seconds / 60 % 60) + " min";
}

const List& list(const Dictionary& report, std::string_view key) {
  static const List none;
  const Value* value = report.find(key);
  return value != nullptr && value->list() != nullptr ? *value->list() : none;
}

void showSource(const Dictionary& source, std::ostream& output) {
  output << "  " << text(source, "origin") << ": ";
  if (source.contains("state")) output << text(source, "state") << ", ";
  if (source.contains("rows_read")) {
    output << text(source, "rows_read") << " rows read, " << text(source, "rows_skipped") << " skipped, ";
  }
  output << text(source, "records") << " records, " << rate(source) << ", " << text(source, "withheld")
         << " withheld, can fill " << text(source, "metrics") << " metrics";
  const Value* age = source.find("last_record_age_ms");
  if (age != nullptr && age->int64().value_or(-1) >= 0) {
    output << ", last record " << duration(*age->int64()) << " old";
  }
  if (source.contains("failure")) output << "; " << text(source, "failure");
  output << '\n';
}

void showClient(const Dictionary& client, std::ostream& output) {
  output << "  " << text(client, "number") << " '" << text(client, "name") << "' (process " << text(client, "process")
         << ", user " << text(client, "user") << "): " << (truth(client, "listening") ? "listens" : "does not listen")
         << ", " << (truth(client, "observes") ? "observes, " : "")
         << (truth(client, "configured") ? "own configuration" : "no configuration") << ", " << text(client, "records")
         << " records, " << rate(client) << ", " << text(client, "queued") << " queued, " << text(client, "lost")
         << " lost\n";
}

ExitStatus showStatus(bool json, Tool& tool) {
  ServiceClient client(tool);
  Dictionary report;
  const ExitStatus status = client.perform(radix::kCommandShowStatus, {}, &report);
  if (status != ExitStatus::Success) return status;
  if (json) {
    std::string line;
    appendJson(report, line);
    tool.output << line << '\n';
    return ExitStatus::Success;
  }
  const Value* uptime = report.find("uptime_ms");
  tool.output << text(report, "service") << ", up for " << duration(uptime != nullptr ? uptime->int64().value_or(0) : 0)
              << '\n';
  tool.output << "configured: "
              << (report.contains("configured_metrics") ? text(report, "configured_metrics") + " metrics"
                                                        : std::string("nothing"))
              << (truth(report, "base_configuration") ? ", with a base configuration" : "") << '\n';
  tool.output << "sources:\n";
  for (const Value& source : list(report, "sources")) {
    if (source.dictionary() != nullptr) showSource(*source.dictionary(), tool.output);
  }
  tool.output << "clients:\n";
  for (const Value& entry : list(report, "clients")) {
    if (entry.dictionary() != nullptr) showClient(*entry.dictionary(), tool.output);
  }
  return ExitStatus::Success;
}

}  // namespace

void addStatusCommand(CLI::App& program, Tool& tool) {
  CLI::App* command = program.add_subcommand("status", "Show the service's sources and clients, rates and losses");
  auto json = std::make_shared<bool>(false);
  command->add_flag("--json", *json, "One JSON object instead of text");
  command->footer(
      "A source runs, has ended (a trace that was played) or has failed; how old its last record is, is told by a "
      "clock\n"
      "that is never set. Rates are the mean of the last ten seconds. Withheld records did not decode; lost ones a "
      "client\n"
      "was too slow for. A client that neither observes nor has a configuration gets answers to its queries alone.\n"
      "\n"
      "Examples:\n"
      "  probectl status\n"
      "  probectl --socket /tmp/test/radixd.sock status --json");
  command->callback([json, &tool] { tool.run = [json, &tool] { return showStatus(*json, tool); }; });
}

}  // namespace probeview
