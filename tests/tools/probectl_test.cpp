// SPDX-License-Identifier: Apache-2.0
#include "tools/probectl.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "tests/tools/run_probectl.h"

namespace probeview {
namespace {

TEST(Probectl, ShowsTheOneVersion) {
  const Outcome outcome = probectl({"--version"});
  EXPECT_EQ(outcome.status, 0);
  EXPECT_EQ(outcome.output, "probectl " PROBEVIEW_VERSION "\n");
}

TEST(Probectl, HelpStatesTheExitStatuses) {
  const Outcome outcome = probectl({"--help"});
  EXPECT_EQ(outcome.status, 0);
  EXPECT_THAT(outcome.output, ::testing::HasSubstr("Exit status: 0 done; 1"));
  EXPECT_EQ(outcome.errors, "");
}

TEST(Probectl, ACommandLineThatIsNotUnderstoodEndsWithStatusTwo) {
  for (const std::vector<std::string>& arguments :
       {std::vector<std::string>{}, {"no-such-subcommand"}, {"--no-such-option"}, {"--socket"}}) {
    const Outcome outcome = probectl(arguments);
    EXPECT_EQ(outcome.status, 2);
    EXPECT_EQ(outcome.output, "");
    EXPECT_NE(outcome.errors, "");
  }
}

}  // namespace
}  // namespace probeview
