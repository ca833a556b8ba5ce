// SPDX-License-Identifier: Apache-2.0
#include "tools/probectl.h"

#include <poll.h>
#include <unistd.h>

#include <algorithm>
#include <climits>
#include <csignal>
#include <cstdlib>
#include <iostream>
#include <optional>
#include <sstream>
#include <string_view>
#include <system_error>
#include <vector>

#include "platform/time_zone.h"
#include "radix/socket_path.h"
#include "values/near_matches.h"
#include "values/plain_text.h"

namespace probeview {

namespace {

// What was written last may still wait to be; a full disk shows here at the latest. A reader that has seen enough is no
// fault.
int finished(Tool& tool, ExitStatus status) {
  tool.output.flush();
  if (tool.output.good() || readerIsGone(tool)) return static_cast<int>(status);
  tool.errors << "probectl: not all of the answer could be written; is the disk full?\n";
  return static_cast<int>(status == ExitStatus::Success ? ExitStatus::Failure : status);
}

// Whether so much on standard output may wait for its reader. A pipe that says that there is room has room for this
// much.
bool mayHaveToWait(std::size_t size) {
  pollfd output{STDOUT_FILENO, POLLOUT, 0};
  return size > PIPE_BUF || ::poll(&output, 1, 0) <= 0;
}

// Lets SIGINT and SIGTERM end the program as they would if no loop waited for them. One that the loop has not heard yet
// ends it at once.
class EndableBySignals {
 public:
  EndableBySignals() {
    sigset_t ending;
    sigemptyset(&ending);
    sigaddset(&ending, SIGINT);
    sigaddset(&ending, SIGTERM);
    ::pthread_sigmask(SIG_UNBLOCK, &ending, &before_);
  }
  ~EndableBySignals() { ::pthread_sigmask(SIG_SETMASK, &before_, nullptr); }
  EndableBySignals(const EndableBySignals&) = delete;
  EndableBySignals& operator=(const EndableBySignals&) = delete;

 private:
  sigset_t before_{};
};

// Where the command line names a subcommand that there is none of, what to say of it; empty otherwise.
std::string unknownSubcommand(const Command& program, std::span<const std::string> arguments) {
  Command command = program;
  std::string path = program.name();
  for (std::size_t index = 0; index < arguments.size(); ++index) {
    const std::string& word = arguments[index];
    if (word.starts_with("-")) {
      if (word == "--socket") ++index;
      continue;
    }
    const std::vector<Command> subcommands = command.subcommands();
    if (subcommands.empty()) return {};
    const auto found = std::ranges::find(subcommands, word, &Command::name);
    if (found == subcommands.end()) {
      std::vector<std::string> names;
      names.reserve(subcommands.size());
      for (const Command& each : subcommands) names.push_back(each.name());
      const std::string near = didYouMean(word, std::vector<std::string_view>(names.begin(), names.end()));
      return "probectl: there is no subcommand " + quotedExcerpt(word) + (near.empty() ? ";" : near) + " '" + path +
             " --help' lists all\n";
    }
    command = *found;
    path += " " + word;
  }
  return {};
}

}  // namespace

bool readerIsGone(const Tool& tool) {
  if (&tool.output != &std::cout) return false;
  pollfd output{STDOUT_FILENO, 0, 0};
  return ::poll(&output, 1, 0) > 0 && (output.revents & (POLLERR | POLLHUP)) != 0;
}

void writeLine(Tool& tool, std::string_view line) {
  std::optional<EndableBySignals> whileItWaits;
  if (&tool.output == &std::cout && mayHaveToWait(line.size() + 1)) whileItWaits.emplace();
  tool.output << line << '\n';
  tool.output.flush();
}

CommandLine makeProbectlGrammar(Tool& tool) {
  CommandLine program("probectl", "Looks into the metrics of the phone's radio, live or by hand.");
  program.describeHelpAndVersion("Show this help and exit; also after a subcommand", "Show the version and exit");
  program
      .option("--socket", tool.socketPath,
              "The service's socket; otherwise $RADIXD_SOCKET, the user's, then the system's")
      .check(radix::socketPathTrouble);
  program.requireSubcommand();
  program.helpColumn(36);
  program.footer(
      "Exit status: 0 done; 1 the answer is no (a payload does not decode, the service refuses or\n"
      "is away, a file cannot be read, the disk is full); 2 the command line is not understood; 3 what\n"
      "was fed stops the program.\n"
      "\n"
      "'probectl SUBCOMMAND --help' shows a subcommand's options with examples.");
  addSubcommands(program, tool);
  return program;
}

int runProbectl(std::span<const std::string> arguments, std::istream& input, std::ostream& output,
                std::ostream& errors) {
  Tool tool{.input = input, .output = output, .errors = errors, .socketPath = {}, .run = {}};
  CommandLine program = makeProbectlGrammar(tool);
  std::ostringstream said;
  if (const std::optional<int> status = program.parse(arguments, output, said)) {
    const std::string unknown = *status == 0 ? std::string() : unknownSubcommand(program, arguments);
    errors << (unknown.empty() ? said.str() : unknown);
    return finished(tool, static_cast<ExitStatus>(*status));
  }
  if (const auto trouble = settleTimeZone()) tool.errors << "probectl: " << *trouble << '\n';
  if (tool.socketPath) setenv("RADIXD_SOCKET", tool.socketPath->c_str(), 1);
  try {
    return finished(tool, tool.run());
  } catch (const std::system_error& error) {
    // No descriptors or no threads are left to this process.
    tool.errors << "probectl: cannot begin: " << error.what() << '\n';
    return static_cast<int>(ExitStatus::Failure);
  }
}

}  // namespace probeview
