// SPDX-License-Identifier: Apache-2.0
//
// page_viewer KEY   the viewer's window as probeview --window shows it, standing on a page from the start; the log goes
//                   where probeview would write it
#include <iostream>

#include "app/viewer.h"
#include "ui/qt/window.h"

int main(int argc, char** argv) {
  using namespace probeview;
  if (argc != 2) {
    std::cerr << "usage: page_viewer KEY, such as \"LTE RRC State\"\n";
    return 2;
  }
  const MakeWindow makeWindow = [argv] {
    static int nameAlone = 1;
    return qt::makeWindowFront(nameAlone, argv);
  };
  return runViewer({.front = FrontKind::Window, .logFile = {}, .pageKey = argv[1]}, makeWindow, std::cerr);
}
