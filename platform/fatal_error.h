// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <functional>
#include <string_view>

namespace probeview {

// Stops the program because a contract is broken: writes what waits in the logs and then one line with the reason to
// standard error, both together for at most a second, and aborts, in release builds too, from any thread and from
// inside a queue's task. Never for bad input from outside.
[[noreturn]] void fatalError(std::string_view reason);

// Who holds lines back or has the screen registers here how it lets go; run in order before the logs are written. Must
// not wait. Main thread, at start-up.
void addFatalErrorFlush(std::function<void()> flush);

// Sees the reason after the flushes. It may throw to leave fatalError(), which is how tests and the batch tool observe
// a stop without ending their process. An empty function removes it.
void setFatalErrorObserver(std::function<void(std::string_view reason)> observer);

}  // namespace probeview
