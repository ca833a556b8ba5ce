// SPDX-License-Identifier: Apache-2.0
#include "tools/query_command.h"

#include <chrono>
#include <memory>
#include <optional>
#include <ostream>
#include <string>

#include "messages/metric_identifiers.h"
#include "tools/names.h"
#include "tools/record_text.h"
#include "tools/service_client.h"

namespace probeview {

namespace {

// How long a source may take; a modem reads files from a card for it.
constexpr std::chrono::seconds answerDeadline{5};

struct QueryOptions {
  std::string metric;
  RecordText::Options text;
};

ExitStatus query(const QueryOptions& options, Tool& tool) {
  const std::optional<std::int64_t> metric = identifierNamed(options.metric);
  if (!metric) {
    tool.errors << "probectl: " << unknownMetric(options.metric) << '\n';
    return ExitStatus::UsageError;
  }
  ServiceClient client(tool);
  std::optional<Dictionary> answer;
  // What was asked for: the metric, or a metric of the trigger that bears the identifier.
  std::int64_t wanted = *metric;
  client.listen([&](const Dictionary& event) {
    const Value* id = event.find(radix::kKeyMetricID);
    if (id != nullptr && id->int64() == wanted && !answer) answer = event;
  });
  // An older service sends every record to whoever has pushed nothing, the last ones first; they are no answer.
  if (const ExitStatus status = client.drain(); status != ExitStatus::Success) return status;
  answer.reset();
  const Dictionary arguments{{radix::kKeyAppID, radix::serviceAppId}, {radix::kKeyMetricID, *metric}};
  Dictionary reply;
  const ExitStatus status = client.perform(radix::kCommandQueryMetric, arguments, &reply);
  if (status != ExitStatus::Success) return status;
  if (const Value* asked = reply.find("metrics");
      asked != nullptr && asked->list() != nullptr && !asked->list()->empty()) {
    wanted = (*asked->list())[0].int64().value_or(wanted);
  }
  if (!client.loop().runUntil([&answer] { return answer.has_value(); }, answerDeadline)) {
    tool.errors << "probectl: the service took the query, but no record came within " << answerDeadline.count()
                << " s\n";
    return ExitStatus::Failure;
  }
  tool.output << RecordText(options.text).line(*answer) << '\n';
  tool.output.flush();
  return ExitStatus::Success;
}

}  // namespace

void addQueryCommand(Command program, Tool& tool) {
  Command command = program.subcommand("query", "Ask the service to report one metric now");
  auto options = std::make_shared<QueryOptions>();
  command.option("METRIC", options->metric, "A metric, or a metric's identifier (decimal or 0x…)").required();
  command.flag("--json", options->text.json, "One JSON object instead of text, as watch prints it");
  command.flag("--personal", options->text.personal,
               "Show IMSI, TMSI, GUTI, addresses and SIM contents, which are … otherwise");
  command.footer(
      "Prints the record that answers. Exit status 1 when no source can fill the metric.\n"
      "\n"
      "Examples:\n"
      "  probectl query K_SIM_FILE_INFO\n"
      "  probectl query 0x3C4E04 --json");
  command.whenChosen([options, &tool] { tool.run = [options, &tool] { return query(*options, tool); }; });
}

}  // namespace probeview
