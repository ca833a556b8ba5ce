// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace probeview::qt {

// Has what the toolkit says of itself (a warning of a missing folder, a plugin or a display) written to standard error
// as a log: by a thread of its own and within a bound, so that a standard error that nobody reads keeps no window from
// being drawn. From any thread. Main thread, before the toolkit is used.
void logToolkitMessages();

}  // namespace probeview::qt
