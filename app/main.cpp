// SPDX-License-Identifier: Apache-2.0
#include <iostream>

#include "app/window.h"

int main(int argc, char** argv) {
  return probeview::runProbeview(argc, argv, probeview::windowMaker(argv), std::cout, std::cerr);
}
