// SPDX-License-Identifier: Apache-2.0
//
// Stands in for window_front.cpp where the window is not built.
#include "app/window_front.h"

namespace probeview {

const bool hasWindowFront = false;

std::unique_ptr<Front> makeWindowFront(int&, char**, std::string& error) {
  error = "this build has no window; --terminal and --print show the pages without one";
  return nullptr;
}

}  // namespace probeview
