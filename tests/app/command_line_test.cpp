// SPDX-License-Identifier: Apache-2.0
//
// The viewer's command line.
#include <gtest/gtest.h>

#include <sstream>
#include <string>
#include <vector>

#include "app/viewer.h"

namespace probeview {
namespace {

struct Answer {
  int status;
  std::string output;
  std::string errors;
};

Answer run(std::vector<std::string> arguments) {
  arguments.insert(arguments.begin(), "probeview");
  std::vector<const char*> pointers;
  for (const auto& argument : arguments) pointers.push_back(argument.c_str());
  std::ostringstream output;
  std::ostringstream errors;
  const int status = runProbeview(static_cast<int>(arguments.size()), pointers.data(), nullptr, output, errors);
  return {status, output.str(), errors.str()};
}

TEST(CommandLine, TheVersionIsTheOneOfTheProject) {
  const auto answer = run({"--version"});
  EXPECT_EQ(answer.status, 0);
  EXPECT_EQ(answer.output, "probeview " PROBEVIEW_VERSION "\n");
}

TEST(CommandLine, HelpNamesEveryFrontAndTheEnvironment) {
  const auto answer = run({"--help"});
  EXPECT_EQ(answer.status, 0);
  for (const std::string word : {"--window", "--terminal", "--print", "--log", "RADIXD_SOCKET", "--version"}) {
    EXPECT_NE(answer.output.find(word), std::string::npos) << word;
  }
}

TEST(CommandLine, WhatIsNotUnderstoodIsAUsageError) {
  EXPECT_EQ(run({"--windw"}).status, 2);
  EXPECT_EQ(run({"--window", "--print"}).status, 2);
  EXPECT_EQ(run({"--log"}).status, 2);
  EXPECT_NE(run({"--windw"}).errors.find("--windw"), std::string::npos);
}

TEST(CommandLine, AUsageErrorQuotesItsArgumentWithoutWhatSteersATerminal) {
  EXPECT_EQ(run({"a\x1b[2J\nprobeview: forged"}).errors,
            "The following argument was not expected: a\\u{1b}[2J\\nprobeview: forged\n"
            "Run with --help for more information.\n");
}

TEST(CommandLine, ABuildWithoutAWindowSaysSo) {
  const auto answer = run({"--window"});
  EXPECT_EQ(answer.status, 1);
  EXPECT_EQ(answer.errors, "this build has no window; --terminal and --print show the pages without one\n");
}

TEST(CommandLine, ALogFileThatCannotBeWrittenIsNamed) {
  const auto answer = run({"--print", "--log", "/nonexistent/log"});
  EXPECT_EQ(answer.status, 1);
  EXPECT_EQ(answer.errors,
            "the log file /nonexistent/log cannot be written: No such file or directory; name another with --log\n");
}

}  // namespace
}  // namespace probeview
