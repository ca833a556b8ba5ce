// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string_view>

#include "source/metric_source.h"

namespace probeview {

// A drive-test log, played: "FILE[,speed=N][,loop]", what follows "trace:" on a command line.
//
// The file is read whole when the source is made (trace_reader.h says what it may be), rows turn into metrics as
// trace_translator.h says. The drive begins when somebody first listens, at the rows' own pace times N (0.001 to
// 100000, 1 unless told); rows of one second come together, the clock of the log going back costs no time, and gaps are
// waited for. While nobody listens it rests, and goes on from there. At its end it stays with what was last known, or
// begins anew after a second of the drive's time where it is to loop.
//
// Records carry the rows' own time. A query reports the latest known value again, with the age that it has by then. A
// trace that does not loop has ended with its last row.
SourceResult makeTraceSource(std::string_view arguments);

}  // namespace probeview
