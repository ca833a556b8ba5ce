// SPDX-License-Identifier: Apache-2.0
//
// The batch sessions of probectl: the first byte chooses decode or store, the rest is what is typed. Every line that
// counts is answered with one line of well-formed JSON, until a fatal stop ends a store's session.
#include <cstdint>
#include <cstdlib>
#include <nlohmann/json.hpp>
#include <sstream>
#include <string>

#include "tools/probectl.h"

using namespace probeview;

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  if (size == 0) return 0;
  const bool store = data[0] % 2 == 1;
  std::istringstream input(std::string(reinterpret_cast<const char*>(data) + 1, size - 1));
  std::ostringstream output;
  std::ostringstream errors;
  const std::string arguments[] = {store ? "store" : "decode", "--batch"};
  const int status = runProbectl(arguments, input, output, errors);
  if (status != 0 && !(store && status == 3)) std::abort();
  if (!errors.str().empty()) std::abort();
  std::istringstream answers(output.str());
  std::string answer;
  while (std::getline(answers, answer)) {
    if (!nlohmann::json::accept(answer)) std::abort();
  }
  return 0;
}
