// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <functional>
#include <string_view>

namespace probeview {

// Stops the program because a contract is broken: flushes the logs, writes one line with the reason to standard error
// and aborts, in release builds too, from any thread and from inside a queue's task. Never for bad input from outside.
[[noreturn]] void fatalError(std::string_view reason);

// Logs register their flush here; run in order before the program stops. Main thread, at start-up.
void addFatalErrorFlush(std::function<void()> flush);

// Sees the reason after the flushes. It may throw to leave fatalError(), which is how tests and the batch tool observe
// a stop without ending their process. An empty function removes it.
void setFatalErrorObserver(std::function<void(std::string_view reason)> observer);

}  // namespace probeview
