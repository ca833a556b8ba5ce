// SPDX-License-Identifier: Apache-2.0
//
// The viewer as a whole: chooses the logs and the front, and runs the application. Main thread, once per process.
#pragma once

#include <functional>
#include <iosfwd>
#include <memory>
#include <optional>
#include <string>

#include "app/front_choice.h"
#include "ui/front.h"

namespace probeview {

// Makes the window; empty in a build that has none. Handed in, so that this room does not know the window's toolkit and
// programs without a window do not carry it.
using MakeWindow = std::function<std::unique_ptr<Front>()>;

struct ViewerOptions {
  std::optional<FrontKind> front;  // absent: whatever suits the circumstances
  // Where the console log goes, "-" being standard output; absent: with the window to standard output, else nowhere.
  std::optional<std::string> logFile;
  std::optional<std::string> pageKey;  // the page to begin with; absent: the launch list
  // Whether standard output is for pages alone, and standard error for what went wrong.
  bool pagesOnly = false;
};

// The exit status: 0 when all went well; 1, with the reason on the stream, when the viewer could not be shown or there
// was no service to print the pages of.
int runViewer(const ViewerOptions& options, const MakeWindow& makeWindow, std::ostream& errors);

// The viewer's command line: understands it and runs the viewer; 2 when it is not understood.
int runProbeview(int argc, const char* const* argv, const MakeWindow& makeWindow, std::ostream& output,
                 std::ostream& errors);

}  // namespace probeview
