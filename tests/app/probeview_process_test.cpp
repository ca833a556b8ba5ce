// SPDX-License-Identifier: Apache-2.0
//
// The real programs, as a person starts them.
#include <gtest/gtest.h>

#include <cstdio>

#include "tests/app/radixd_process.h"
#include "ui/varnet_view_items.h"

namespace probeview {
namespace {

struct Outcome {
  int status;
  std::string output;
};

// Runs a shell command; what it writes to standard output.
Outcome run(const std::string& command) {
  std::FILE* pipe = ::popen(("exec </dev/null; " + command).c_str(), "r");
  if (!pipe) return {-1, ""};
  std::string output;
  char buffer[4096];
  for (std::size_t count = 0; (count = std::fread(buffer, 1, sizeof buffer, pipe)) > 0;) output.append(buffer, count);
  const int status = ::pclose(pipe);
  return {WIFEXITED(status) ? WEXITSTATUS(status) : -1, output};
}

const std::string probeview = PROBEVIEW;
const std::string probectl = PROBECTL;

TEST(Programs, PrintShowsEveryPageOnceWhenEveryMetricHasComeAndEndsWell) {
  RadixdProcess radixd("scenario:city,seed=1");
  ASSERT_TRUE(radixd.start());
  const auto shown = run(probeview + " --print 2>/dev/null");
  EXPECT_EQ(shown.status, 0);
  std::size_t headings = 0;
  for (std::size_t at = shown.output.find("probeview › "); at != std::string::npos;
       at = shown.output.find("probeview › ", at + 1)) {
    ++headings;
  }
  EXPECT_EQ(headings, 42u);
  EXPECT_EQ(shown.output.find("probeview › Device Info › IMSI\n"), 0u) << "no console log";
  EXPECT_EQ(shown.output.find("Received Valid Metric"), std::string::npos);
  EXPECT_NE(shown.output.find("\n  state "), std::string::npos);
  EXPECT_NE(shown.output.find("\nscenario:city · "), std::string::npos);
}

TEST(Programs, TheLineBelowAPageSpeaksOfThatPage) {
  RadixdProcess radixd("scenario:city,seed=1");
  ASSERT_TRUE(radixd.start());
  EXPECT_NE(run(probectl + " pages 'LTE RRC State'").output.find("\n\nscenario:city · "), std::string::npos);
  EXPECT_TRUE(run(probectl + " pages 'LTE Tx Power'").output.ends_with("\n\nno metric fills this page\n"));
}

TEST(Programs, TheConsoleLogGoesToTheFileThatIsNamed) {
  RadixdProcess radixd("scenario:city,seed=1");
  ASSERT_TRUE(radixd.start());
  const TemporaryFolder folder;
  const auto shown = run(probeview + " --print --log " + folder.path() + "/log 2>/dev/null");
  EXPECT_EQ(shown.status, 0);
  EXPECT_EQ(shown.output.find("probeview › Device Info › IMSI\n"), 0u);
  EXPECT_EQ(run("head -n 2 " + folder.path() + "/log").output, "pushing metric file\nQuerying SIM files\n");
}

TEST(Programs, TheConsoleLogComesBeforeThePagesWhereStandardOutputIsNamed) {
  RadixdProcess radixd("scenario:city,seed=1");
  ASSERT_TRUE(radixd.start());
  const auto shown = run(probeview + " --print --log - 2>/dev/null");
  EXPECT_EQ(shown.status, 0);
  EXPECT_EQ(shown.output.find("pushing metric file\n"), 0u);
  EXPECT_NE(shown.output.find("\nQuerying SIM files\n"), std::string::npos);
  EXPECT_NE(shown.output.find("\nReceived Valid Metric\n"), std::string::npos);
  EXPECT_NE(shown.output.find("\nprobeview › Device Info › IMSI\n"), std::string::npos);
}

TEST(Programs, AReaderThatGoesAwayEndsThePrintingInPeace) {
  RadixdProcess radixd("scenario:city,seed=1");
  ASSERT_TRUE(radixd.start());
  // bash: the status of the first program of the pipe.
  const auto shown = run("bash -c '" + probeview + " --print --log - 2>/dev/null | head -n 1; exit ${PIPESTATUS[0]}'");
  EXPECT_EQ(shown.status, 0);
  EXPECT_EQ(shown.output, "pushing metric file\n");
}

TEST(Programs, ProbectlPrintsOnePageAndNothingElse) {
  RadixdProcess radixd("scenario:city,seed=1");
  ASSERT_TRUE(radixd.start());
  const auto shown = run(probectl + " --socket " + radixd.socket() + " pages lte RRC  state 2>&1");
  EXPECT_EQ(shown.status, 0);
  EXPECT_EQ(shown.output.find("probeview › LTE › RRC State\n  timestamp "), 0u);
}

TEST(Programs, ProbectlNamesThePagesThatThereAre) {
  const auto shown = run(probectl + " pages LTE Tx Pwr 2>&1");
  EXPECT_EQ(shown.status, 2);
  EXPECT_EQ(shown.output.find("probectl: there is no page \"LTE Tx Pwr\"; did you mean LTE Tx Power"), 0u)
      << shown.output;
  for (const auto& key : navigablePageKeys()) EXPECT_NE(shown.output.find("  " + key + "\n"), std::string::npos);
}

TEST(Programs, WithoutAServicePrintingSaysWhyAndEndsWithStatusOne) {
  const TemporaryFolder folder;
  const std::string socket = folder.path() + "/radixd.sock";
  const std::string reason = "no baseband service at " + socket + "; start radixd or set RADIXD_SOCKET\n";
  const auto pages = run(probectl + " --socket " + socket + " pages 2>&1");
  EXPECT_EQ(pages.status, 1);
  EXPECT_EQ(pages.output, reason);
  const auto page = run(probectl + " --socket " + socket + " pages LTE RRC State 2>&1 >/dev/null");
  EXPECT_EQ(page.status, 1);
  EXPECT_EQ(page.output, reason);
  const auto shown = run("RADIXD_SOCKET=" + socket + " " + probeview + " --print --log " + folder.path() + "/log 2>&1");
  EXPECT_EQ(shown.status, 1);
  // The system's log goes there, too.
  EXPECT_TRUE(shown.output.ends_with("\n" + reason)) << shown.output;
  EXPECT_EQ(shown.output.find("probeview › "), std::string::npos);
}

TEST(Programs, WatchEndsWhenItsReaderHasGoneAlsoWhileNothingComes) {
  const TemporaryFolder folder;
  // No service, hence no record whose writing would fail. The reader that ends at once is bash's own.
  const auto shown = run("timeout 60 bash -c 'timeout 50 " + probectl + " --socket " + folder.path() +
                         "/radixd.sock watch 2>/dev/null | :; exit ${PIPESTATUS[0]}'");
  EXPECT_EQ(shown.status, 0);
}

TEST(Programs, TheTerminalPagesNeedATerminal) {
  const auto shown = run(probeview + " --terminal 2>&1");
  EXPECT_EQ(shown.status, 1);
  EXPECT_NE(shown.output.find("--print"), std::string::npos);
}

}  // namespace
}  // namespace probeview
