// SPDX-License-Identifier: Apache-2.0
//
// Whole sessions of the batch commands: tests/tools/golden/SUBCOMMAND_*.in is what goes in, .out what came out.
#include <gtest/gtest.h>

#include <algorithm>

#include "tests/support/golden.h"
#include "tests/tools/run_probectl.h"

namespace probeview {
namespace {

const std::filesystem::path folder = "tests/tools/golden";

std::vector<std::string> sessions() {
  std::vector<std::string> names;
  for (const auto& entry : std::filesystem::directory_iterator(folder)) {
    if (entry.path().extension() == ".in") names.push_back(entry.path().stem().string());
  }
  std::sort(names.begin(), names.end());
  return names;
}

class GoldenSession : public ::testing::TestWithParam<std::string> {};

TEST_P(GoldenSession, IsAnsweredAsKept) {
  const std::string subcommand = GetParam().substr(0, GetParam().find('_'));
  const Outcome outcome = probectl({subcommand, "--batch"}, contentOf(folder / (GetParam() + ".in")));
  EXPECT_EQ(outcome.errors, "");
  const std::string& text = outcome.output;
  const bool stopped = text.find("\n{\"fatal\":") != std::string::npos || text.starts_with("{\"fatal\":");
  EXPECT_EQ(outcome.status, stopped ? 3 : 0);
  expectGolden(folder / (GetParam() + ".out"), text);
}

INSTANTIATE_TEST_SUITE_P(Batch, GoldenSession, ::testing::ValuesIn(sessions()),
                         [](const auto& session) { return session.param; });

}  // namespace
}  // namespace probeview
