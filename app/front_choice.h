// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <optional>

namespace probeview {

enum class FrontKind : std::uint8_t { Window, Terminal, Print };

// What decides which front shows the pages.
struct FrontCircumstances {
  std::optional<FrontKind> asked;  // on the command line
  bool hasWindow = false;          // this build has a window
  bool hasDisplay = false;         // WAYLAND_DISPLAY or DISPLAY names one
  bool hasTerminal = false;        // standard input and output are a terminal
};

// What was asked for; else a window where there is a display, the terminal where there is one, plain text otherwise.
FrontKind chooseFront(const FrontCircumstances& circumstances);

// Those of this process.
FrontCircumstances frontCircumstances(std::optional<FrontKind> asked, bool hasWindow);

}  // namespace probeview
