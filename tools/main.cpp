// SPDX-License-Identifier: Apache-2.0
#include <iostream>

#include "tools/probectl.h"

int main(int argc, char** argv) {
  std::ios::sync_with_stdio(false);
  const std::vector<std::string> arguments(argv + 1, argv + argc);
  return probeview::runProbectl(arguments, std::cin, std::cout, std::cerr);
}
