// SPDX-License-Identifier: Apache-2.0
#include "tools/watch_command.h"

#include <signal.h>

#include <CLI/CLI.hpp>
#include <chrono>
#include <cstdint>
#include <memory>
#include <ostream>
#include <string>

#include "tools/record_text.h"
#include "tools/service_client.h"

namespace probeview {

namespace {

struct WatchOptions {
  RecordText::Options text;
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
        tool_.errors << "probectl: " << state.trouble << "; waiting for it\n";
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

ExitStatus watch(const WatchOptions& options, Tool& tool) {
  ServiceClient client(tool, {.observes = true});
  client.loop().onSignals({SIGINT, SIGTERM}, [&client](int) { client.loop().stop(); });
  RecordText text(options.text);
  std::uint64_t shown = 0;
  bool ended = false;
  client.listen([&](const Dictionary& event) {
    if (ended) return;
    tool.output << text.line(event) << '\n';
    tool.output.flush();
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

void addWatchCommand(CLI::App& program, Tool& tool) {
  CLI::App* command = program.add_subcommand("watch", "Print each metric as it arrives from the service");
  auto options = std::make_shared<WatchOptions>();
  command->add_flag("--json", options->text.json, "One JSON object a line instead of text");
  command->add_flag("--personal", options->text.personal,
                    "Show IMSI, TMSI, GUTI, addresses and SIM contents, which are … otherwise");
  command->add_option("--count", options->count, "End after so many records")
      ->type_name("N")
      ->check(CLI::PositiveNumber);
  command->footer(
      "Begins with the last record of each metric; then every metric comes, at its source's own period or shorter\n"
      "where a configuration asks. Waits for the service while there is none. Ends on Ctrl-C.\n"
      "\n"
      "With --json: {\"time\":milliseconds since "
      "1970,\"origin\":…,\"metric\":\"K_LTE_RRC_STATE\",\"id\":…,\"dict\":{…}}\n"
      "\n"
      "Examples:\n"
      "  probectl watch\n"
      "  probectl watch --json | jq 'select(.metric == \"K_LTE_RRC_STATE\") | .dict.state'");
  command->callback([options, &tool] { tool.run = [options, &tool] { return watch(*options, tool); }; });
}

}  // namespace probeview
