// SPDX-License-Identifier: Apache-2.0
//
// The viewer as a whole: chooses the logs and the front, and runs the application. Main thread, once per process.
#pragma once

#include <iosfwd>
#include <optional>
#include <string>

#include "app/front_choice.h"

namespace probeview {

struct ViewerOptions {
  std::optional<FrontKind> front;      // absent: whatever suits the circumstances
  std::optional<std::string> logFile;  // where the console log goes; absent: see below
  std::optional<std::string> pageKey;  // the page to begin with; absent: the launch list
  // Whether standard output is for pages alone. Else the console log goes there, unless the terminal's pages need it.
  bool pagesOnly = false;
};

// The exit status: 0 when all went well; 1, with the reason on the stream, when the viewer could not be shown. A window
// takes its own options out of the arguments, which must live as long as the process.
int runViewer(const ViewerOptions& options, int& argc, char** argv, std::ostream& errors);

// The viewer's command line: understands it and runs the viewer; 2 when it is not understood.
int runProbeview(int argc, char** argv, std::ostream& output, std::ostream& errors);

}  // namespace probeview
