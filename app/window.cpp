// SPDX-License-Identifier: Apache-2.0
#include "app/window.h"

#include "ui/qt/toolkit_messages.h"
#include "ui/qt/window.h"

namespace probeview {

MakeWindow windowMaker(char** argv) {
  return [argv] {
    // The toolkit keeps a reference to the count. It sees the program's name alone: its own options are not offered.
    static int nameAlone = 1;
    qt::logToolkitMessages();
    return qt::makeWindowFront(nameAlone, argv);
  };
}

}  // namespace probeview
