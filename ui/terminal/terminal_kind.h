// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace probeview::terminal {

// Whether the system's terminal description of that name is there.
bool isKnownTerminal(const char* kind);

}  // namespace probeview::terminal
