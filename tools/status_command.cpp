// SPDX-License-Identifier: Apache-2.0
#include "tools/status_command.h"

#include <memory>
#include <ostream>
#include <string>
#include <string_view>

#include "radix/service_commands.h"
#include "tools/reply_reader.h"
#include "tools/service_client.h"
#include "values/json.h"

namespace probeview {

namespace {

void showSource(const ReplyReader& source, std::ostream& output) {
  output << "  " << source.text("origin") << ": ";
  // What older services do not say.
  if (source.contains("state")) output << source.text("state") << ", ";
  if (source.contains("rows_read")) {
    output << countText(source.count("rows_read")) << " rows read, " << countText(source.count("rows_skipped"))
           << " skipped, ";
  }
  output << countText(source.count("records")) << " records, " << rateText(source.rate("records_per_second")) << ", "
         << countText(source.count("withheld")) << " withheld, can fill " << countText(source.count("metrics"))
         << " metrics";
  if (const auto age = source.duration("last_record_age_ms")) {
    output << ", last record " << durationText(age) << " old";
  }
  if (source.contains("failure")) output << "; " << source.text("failure");
  output << '\n';
}

void showClient(const ReplyReader& client, std::ostream& output) {
  output << "  " << countText(client.count("number")) << " '" << client.text("name") << "' (process "
         << client.text("process") << ", user " << client.text("user")
         << "): " << (client.truth("listening") ? "listens" : "does not listen") << ", "
         << (client.truth("observes") ? "observes, " : "")
         << (client.truth("configured") ? "own configuration" : "no configuration") << ", "
         << countText(client.count("records")) << " records, " << rateText(client.rate("records_per_second")) << ", "
         << countText(client.count("queued")) << " queued, " << countText(client.count("lost")) << " lost\n";
}

void showLeftOut(const ReplyReader& report, std::string_view key, std::ostream& output) {
  if (const std::size_t count = report.entriesLeftOut(key); count > 0) output << "  and " << count << " more\n";
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
  showReport(report, tool.output);
  return ExitStatus::Success;
}

}  // namespace

void showReport(const Dictionary& reply, std::ostream& output) {
  const ReplyReader report(reply);
  output << report.text("service") << ", up for " << durationText(report.duration("uptime_ms")) << '\n';
  output << "configured: "
         << (report.contains("configured_metrics") ? countText(report.count("configured_metrics")) + " metrics"
                                                   : std::string("nothing"))
         << (report.truth("base_configuration") ? ", with a base configuration" : "") << '\n';
  output << "sources:\n";
  for (const ReplyReader& source : report.entries("sources")) showSource(source, output);
  showLeftOut(report, "sources", output);
  output << "clients:\n";
  for (const ReplyReader& client : report.entries("clients")) showClient(client, output);
  showLeftOut(report, "clients", output);
}

void addStatusCommand(Command program, Tool& tool) {
  Command command = program.subcommand("status", "Show the service's sources and clients, rates and losses");
  auto json = std::make_shared<bool>(false);
  command.flag("--json", *json, "One JSON object instead of text");
  command.footer(
      "A source runs, has ended (a trace that was played) or has failed; how old its last record is, is told by a "
      "clock\n"
      "that is never set. Rates are the mean of the last ten seconds. Withheld records did not decode; lost ones a "
      "client\n"
      "was too slow for. A client that neither observes nor has a configuration gets answers to its queries alone.\n"
      "\n"
      "Examples:\n"
      "  probectl status\n"
      "  probectl --socket /tmp/test/radixd.sock status --json");
  command.whenChosen([json, &tool] { tool.run = [json, &tool] { return showStatus(*json, tool); }; });
}

}  // namespace probeview
