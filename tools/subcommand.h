// SPDX-License-Identifier: Apache-2.0
//
// How a subcommand of probectl is made. Each lies in a file of its own and offers one function that declares it:
//
//   void addStatusCommand(Command program, Tool& tool) {
//     Command command = program.subcommand("status", "Show sources, clients, rates and losses");
//     struct Options { bool json = false; };
//     auto options = std::make_shared<Options>();
//     command.flag("--json", options->json, "One JSON object instead of text");
//     command.footer("Examples:\n  probectl status");
//     command.whenChosen([options, &tool] { tool.run = [options, &tool] { return showStatus(*options, tool); }; });
//   }
//
// and one line in subcommands.cpp. The callback only chooses what to run; it runs after the whole command line has been
// understood, so that an error further on leaves nothing half done.
#pragma once

#include <functional>
#include <iosfwd>
#include <optional>
#include <string>
#include <string_view>

#include "platform/command_line.h"

namespace probeview {

// The exit statuses of probectl; the manual page lists them.
enum class ExitStatus : int {
  Success = 0,
  Failure = 1,  // the answer is no: a payload does not decode, the service refuses, the disk is full …
  UsageError = usageErrorStatus,  // the command line is not understood
  BrokenContract = 3,             // what was fed stops the program (store --batch)
};

// What a subcommand is given to live on. Streams are handed in, so that tests can put their own in their place.
struct Tool {
  std::istream& input;
  std::ostream& output;
  std::ostream& errors;
  // The service's socket, where the command line names one. It is also in the environment as RADIXD_SOCKET before run
  // is called, which is where the client library looks for it.
  std::optional<std::string> socketPath;
  // Set by the chosen subcommand.
  std::function<ExitStatus()> run;
};

// Whether nobody reads the tool's output any more, as far as that can be known without writing to it.
bool readerIsGone(const Tool& tool);

// Writes a line of an answer that goes on, and hands it on at once. The reader may take its time; while it is waited
// for, SIGINT and SIGTERM end the program, as the loop that would hear them stands still.
void writeLine(Tool& tool, std::string_view line);

using AddSubcommand = void (*)(Command program, Tool& tool);

// Declares every subcommand, in the order of --help.
void addSubcommands(Command program, Tool& tool);

}  // namespace probeview
