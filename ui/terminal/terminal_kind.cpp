// SPDX-License-Identifier: Apache-2.0
//
// Alone in its file, because term.h defines macros with names like "lines" and "columns".
#include "ui/terminal/terminal_kind.h"

#include <curses.h>
#include <unistd.h>
// After curses.h, which it needs.
#include <term.h>

namespace probeview::terminal {

bool isKnownTerminal(const char* kind) {
  int status = 0;
  if (::setupterm(kind, STDOUT_FILENO, &status) != OK) return false;
  ::del_curterm(::cur_term);
  return true;
}

}  // namespace probeview::terminal
