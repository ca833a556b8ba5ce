// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <span>
#include <string>

#include "values/line_sink.h"

namespace probeview {

// The service program: understands the command line, serves until SIGTERM or SIGINT, and returns the exit status: 0
// after a clean end, 1 when it could not begin, 2 when the command line is not understood. Main thread, before any
// other thread is started. The log takes one line per fact.
int runRadixd(std::span<const std::string> arguments, LineSink& log);

}  // namespace probeview
