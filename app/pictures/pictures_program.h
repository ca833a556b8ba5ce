// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <iosfwd>

namespace probeview {

// The command line of probeview-pictures: understands it, opens a metric session as the viewer does and draws its
// pages. The exit status: 0 when the picture is there, 1 when it cannot be made, 2 when the command line is not
// understood.
int runPicturesProgram(int argc, char** argv, std::ostream& output, std::ostream& errors);

}  // namespace probeview
