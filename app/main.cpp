// SPDX-License-Identifier: Apache-2.0
#include <iostream>

#include "app/viewer.h"

int main(int argc, char** argv) { return probeview::runProbeview(argc, argv, std::cout, std::cerr); }
