// SPDX-License-Identifier: Apache-2.0
#include "tools/probectl.h"

#include <cstdlib>
#include <ostream>
#include <vector>

namespace probeview {

std::unique_ptr<CLI::App> makeProbectlGrammar(Tool& tool) {
  auto program =
      std::make_unique<CLI::App>("Looks into the metrics of the phone's radio, live or by hand.", "probectl");
  program->set_version_flag("--version", std::string("probectl ") + PROBEVIEW_VERSION, "Show the version and exit");
  program->set_help_flag("-h,--help", "Show this help and exit; also after a subcommand");
  program->add_option("--socket", tool.socketPath,
                      "The service's socket; otherwise $RADIXD_SOCKET, the user's, then the system's");
  program->require_subcommand(1);
  program->get_formatter()->column_width(36);
  program->footer(
      "Exit status: 0 done; 1 the answer is no (a payload does not decode, the service refuses or\n"
      "is away, a file cannot be read); 2 the command line is not understood; 3 what was fed stops\n"
      "the program.\n"
      "\n"
      "'probectl SUBCOMMAND --help' shows a subcommand's options with examples.");
  addSubcommands(*program, tool);
  return program;
}

int runProbectl(std::span<const std::string> arguments, std::istream& input, std::ostream& output,
                std::ostream& errors) {
  Tool tool{.input = input, .output = output, .errors = errors, .socketPath = {}, .run = {}};
  const std::unique_ptr<CLI::App> program = makeProbectlGrammar(tool);
  try {
    // The library takes the arguments last first.
    program->parse(std::vector<std::string>(arguments.rbegin(), arguments.rend()));
  } catch (const CLI::ParseError& error) {
    // Help and version arrive here too, as errors with status 0.
    const int status = program->exit(error, output, errors);
    return static_cast<int>(status == 0 ? ExitStatus::Success : ExitStatus::UsageError);
  }
  if (tool.socketPath) setenv("RADIXD_SOCKET", tool.socketPath->c_str(), 1);
  return static_cast<int>(tool.run());
}

}  // namespace probeview
