// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <sstream>
#include <string>
#include <vector>

#include "tools/probectl.h"

namespace probeview {

struct Outcome {
  int status;
  std::string output;
  std::string errors;
};

// Runs the program in this process.
inline Outcome probectl(const std::vector<std::string>& arguments, const std::string& input = "") {
  std::istringstream in(input);
  std::ostringstream out;
  std::ostringstream err;
  const int status = runProbectl(arguments, in, out, err);
  return {status, out.str(), err.str()};
}

}  // namespace probeview
