// SPDX-License-Identifier: Apache-2.0
#include <optional>
#include <ostream>

#include "app/viewer.h"
#include "platform/command_line.h"

namespace probeview {

int runProbeview(int argc, const char* const* argv, const MakeWindow& makeWindow, std::ostream& output,
                 std::ostream& errors) {
  CommandLine program(
      "probeview",
      "Shows the live state of the phone's cellular radio: LTE, UMTS and GSM cells, measurements, connection states,\n"
      "mobility contexts, bearers and SIM files, as the baseband service radixd reports them.");
  ViewerOptions options;
  bool asksForWindow = false, asksForTerminal = false, asksForText = false;
  CommandOption window =
      program.flag("--window", asksForWindow, "Show the pages in a window (default where there is a display)");
  CommandOption terminal =
      program.flag("--terminal", asksForTerminal, "Show the pages in the terminal (default where there is no display)");
  CommandOption print =
      program.flag("--print", asksForText,
                   "Wait until every metric has come once, at most 15 s, then print every page as plain text and end");
  window.excludes(terminal).excludes(print);
  terminal.excludes(print);
  program
      .option("--log", options.logFile,
              "Write the console log of every metric to this file, - for standard output (default: with the window "
              "standard output, else nowhere)")
      .typeName("FILE");
  program.footer(
      "Keys: arrows, Page Up, Page Down, Home and End move, Return opens; Esc, Backspace and Left go back. In the "
      "window\n"
      "Ctrl+Q and Ctrl+W end the program; in the terminal q does, and ? shows all keys.\n\n"
      "Environment:\n"
      "  RADIXD_SOCKET    the service's socket (default: the user's service, else the system's)\n"
      "  LC_ALL, LC_CTYPE, LANG    the terminal's pages are drawn in ASCII where the encoding is not UTF-8\n\n"
      "Exit status: 0 when all went well, 1 when the pages could not be shown or there is no service to print them "
      "of,\n"
      "2 when the command line was not understood.");
  if (const std::optional<int> status = program.parse(argumentsOf(argc, argv), output, errors)) return *status;
  if (asksForWindow) options.front = FrontKind::Window;
  if (asksForTerminal) options.front = FrontKind::Terminal;
  if (asksForText) options.front = FrontKind::Print;
  return runViewer(options, makeWindow, errors);
}

}  // namespace probeview
