// SPDX-License-Identifier: Apache-2.0
//
// bench [ROUNDS [FILE]]     writes the tables of times, and their figures into the file
// bench --instructions      what callgrind counts, one dump per case (bench/run)
// bench --results           what each contender makes of the first payload, to compare by eye
#include <cstdlib>
#include <fstream>
#include <iostream>
#include <string_view>

#include "bench/case.h"
#include "bench/measure.h"

int main(int argc, char** argv) {
  const std::string_view argument = argc > 1 ? argv[1] : "101";
  if (argument == "--instructions") {
    probeview::bench::countInstructions(std::cout);
  } else if (argument == "--results") {
    for (const auto& contender : probeview::bench::allContenders()) {
      std::cout << contender.name << ": " << contender.make(probeview::bench::payloadSet("a"))->result() << "\n";
    }
  } else if (const int rounds = std::atoi(argument.data()); rounds > 0) {
    std::ofstream figures;
    if (argc > 2) figures.open(argv[2]);
    probeview::bench::measureAll(rounds, std::cout, figures);
    if (!figures) {
      std::cerr << "bench: the figures cannot be written to " << argv[2] << "\n";
      return 1;
    }
  } else {
    std::cerr << "bench: '" << argument << "' is no number of rounds\n";
    return 2;
  }
  return 0;
}
