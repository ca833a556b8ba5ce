// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <functional>
#include <string_view>
#include <thread>

namespace probeview {

// A thread that carries the end of the label as its name and takes no signals: they belong to the main thread, whose
// loop turns them into events.
std::thread startThread(std::string_view label, std::function<void()> body);

}  // namespace probeview
