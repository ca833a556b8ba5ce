// SPDX-License-Identifier: Apache-2.0
//
// The window of the viewer: a front on Qt Quick.
#pragma once

#include <memory>

#include "ui/front.h"

namespace probeview::qt {

// A front that shows the pages in a window and ends when the window is closed. Its main queue is Qt's event loop. To be
// made once, on the thread that is to be the main one, before anything else uses Qt; takes Qt's own options out of the
// arguments, which must live as long as the front does. Without a display to connect to, Qt itself ends the program
// and says so.
std::unique_ptr<Front> makeWindowFront(int& argc, char** argv);

}  // namespace probeview::qt
