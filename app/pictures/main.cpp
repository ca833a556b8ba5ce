// SPDX-License-Identifier: Apache-2.0
#include <iostream>

#include "app/pictures/pictures_program.h"

int main(int argc, char** argv) { return probeview::runPicturesProgram(argc, argv, std::cout, std::cerr); }
