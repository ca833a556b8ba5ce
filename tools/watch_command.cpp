// SPDX-License-Identifier: Apache-2.0
#include "tools/watch_command.h"

#include <signal.h>

#include <chrono>
#include <cstdint>
#include <memory>
#include <optional>
#include <ostream>
#include <set>
#include <string>
#include <vector>

#include "messages/metric_identifiers.h"
#include "tools/names.h"
#include "tools/record_text.h"
#include "tools/service_client.h"
#include "values/plain_text.h"

namespace probeview {

namespace {

struct WatchOptions {
  RecordText::Options text;
  std::vector<std::string> metrics;  // empty: all
  bool changes = false;
  std::uint64_t count = 0;  // 0: no end
};

// Says on the tool's errors what a person should know about the service while records come, or why none do.
class ServiceNotes {
 public:
  ServiceNotes(const ServiceClient& client, Tool& tool) : client_(client), tool_(tool) {}

  void look() {
    const radix::client::ConnectionState state = client_.connection();
    if (state.connected != connected_ || (!state.connected && state.trouble != trouble_)) {
      if (state.connected && wasAway_) tool_.errors << "probectl: the baseband service is there\n";
      if (!state.connected && !state.trouble.empty()) {
        tool_.errors << "probectl: " << onOneLine(state.trouble) << "; waiting for it\n";
        wasAway_ = true;
      }
      connected_ = state.connected;
      trouble_ = state.trouble;
    }
    if (state.lostEvents != lost_) {
      tool_.errors << "probectl: " << state.lostEvents - lost_ << " records lost, this end is too slow\n";
      lost_ = state.lostEvents;
    }
  }

 private:
  const ServiceClient& client_;
  Tool& tool_;
  bool connected_ = false;
  bool wasAway_ = false;
  std::string trouble_;
  std::uint64_t lost_ = 0;
};

// The identifiers of the metrics that are named; absent, with the reason told, when nobody knows one of them.
std::optional<std::set<std::int64_t>> metricsToShow(const WatchOptions& options, Tool& tool) {
  std::set<std::int64_t> shown;
  for (const std::string& text : options.metrics) {
    const std::optional<std::int64_t> metric = identifierNamed(text);
    if (!metric) {
      tool.errors << "probectl: " << unknownMetric(text) << '\n';
      return std::nullopt;
    }
    shown.insert(*metric);
  }
  return shown;
}

bool isOneOf(const std::set<std::int64_t>& metrics, const Dictionary& event) {
  const Value* id = event.find(radix::kKeyMetricID);
  return metrics.empty() || (id != nullptr && id->int64() && metrics.contains(*id->int64()));
}

ExitStatus watch(const WatchOptions& options, Tool& tool) {
  const std::optional<std::set<std::int64_t>> wanted = metricsToShow(options, tool);
  if (!wanted) return ExitStatus::UsageError;
  ServiceClient client(tool, {.observes = true});
  client.loop().onSignals({SIGINT, SIGTERM}, [&client](int) { client.loop().stop(); });
  RecordText text(options.text);
  std::uint64_t shown = 0;
  bool ended = false;
  client.listen([&](const Dictionary& event) {
    if (ended || !isOneOf(*wanted, event)) return;
    const std::optional<std::string> line = options.changes ? text.changedLine(event) : text.line(event);
    if (!line) return;
    writeLine(tool, *line);
    ++shown;
    // Who reads may have gone, or seen enough.
    ended = !tool.output || (options.count != 0 && shown == options.count);
    if (ended) client.loop().stop();
  });
  ServiceNotes notes(client, tool);
  const auto looking = client.loop().every(std::chrono::milliseconds(500), [&] {
    notes.look();
    // While no record comes, no failing write tells that the reader has gone.
    if (readerIsGone(tool)) client.loop().stop();
  });
  client.loop().run();
  return ExitStatus::Success;
}

}  // namespace

void addWatchCommand(Command program, Tool& tool) {
  Command command = program.subcommand("watch", "Print each metric as it arrives from the service");
  auto options = std::make_shared<WatchOptions>();
  command.option("METRIC", options->metrics,
                 "Those metrics alone, by name or identifier (decimal or 0x…); without it, all");
  command.flag("--json", options->text.json, "One JSON object a line instead of text");
  command.flag("--changes", options->changes,
               "Of each metric the first record, then only what changes, timestamps apart");
  command.flag("--personal", options->text.personal,
               "Show IMSI, TMSI, GUTI, addresses and SIM contents, which are … otherwise");
  command.option("--count", options->count, "End after so many records")
      .typeName("N")
      .check([](const std::string& text) {
        const auto count = parseNumber<std::uint64_t>(text, 10);
        if (count && *count > 0) return std::string();
        return quotedExcerpt(text) + " is no number of records: a whole number, at least 1";
      });
  command.footer(
      "Begins with the last record of each metric; then every metric comes, at its source's own period or shorter\n"
      "where a configuration asks. Waits for the service while there is none. Ends on Ctrl-C.\n"
      "\n"
      "With --json: {\"time\":milliseconds since "
      "1970,\"origin\":…,\"metric\":\"K_LTE_RRC_STATE\",\"id\":…,\"dict\":{…}}; with\n"
      "--changes also \"gone\":[key…] when fields are no longer there. 'probectl metrics' lists the metrics.\n"
      "\n"
      "Examples:\n"
      "  probectl watch\n"
      "  probectl watch --changes K_LTE_RRC_STATE K_UMTS_RRC_STATE\n"
      "  probectl watch --json | jq 'select(.metric == \"K_LTE_RRC_STATE\") | .dict.state'");
  command.whenChosen([options, &tool] { tool.run = [options, &tool] { return watch(*options, tool); }; });
}

}  // namespace probeview
