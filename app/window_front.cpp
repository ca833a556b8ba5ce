// SPDX-License-Identifier: Apache-2.0
#include "app/window_front.h"

#include "ui/qt/window.h"

namespace probeview {

const bool hasWindowFront = true;

std::unique_ptr<Front> makeWindowFront(int& argc, char** argv, std::string&) { return qt::makeWindowFront(argc, argv); }

}  // namespace probeview
