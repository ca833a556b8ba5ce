// SPDX-License-Identifier: Apache-2.0
#include "service/log.h"

#include <gtest/gtest.h>

#include <chrono>
#include <string>
#include <vector>

#include "platform/manual_loop.h"
#include "tests/service/harness/scripted_source.h"

namespace probeview {
namespace {

using std::chrono::nanoseconds;
using std::chrono::seconds;

TEST(ServiceLog, WritesWhatIsImportantEnoughAndALineStaysALine) {
  KeptLines lines;
  ServiceLog log(lines, LogLevel::Warning);
  log.write(LogLevel::Error, "a");
  log.write(LogLevel::Warning, "b\nradixd: error: forged\x1b[31m");
  log.write(LogLevel::Info, "c");
  EXPECT_EQ(lines.lines,
            (std::vector<std::string>{"radixd: error: a", "radixd: warning: b\\nradixd: error: forged\\u{1b}[31m"}));
}

TEST(BoundedLines, AThousandLinesAMinuteAreHandedOnAndOfMoreOnlyTheNumber) {
  ManualLoop clock;
  KeptLines lines;
  {
    BoundedLines bounded(lines, clock);
    for (int number = 0; number < 1000; ++number) bounded.line("a");
    EXPECT_EQ(lines.lines.size(), 1000U);
    bounded.line("b");
    clock.advance(seconds(60) - nanoseconds(1));
    bounded.line("b");
    EXPECT_EQ(lines.lines.size(), 1000U);
    clock.advance(nanoseconds(1));
    bounded.line("c");
    ASSERT_EQ(lines.lines.size(), 1002U);
    EXPECT_EQ(lines.lines[1000],
              "radixd: warning: 2 lines were left out here, as there were more than 1000 in a minute");
    EXPECT_EQ(lines.lines[1001], "c");
    for (int number = 0; number < 1000; ++number) bounded.line("d");
    EXPECT_EQ(lines.lines.size(), 2001U);
  }
  EXPECT_EQ(lines.lines.back(), "radixd: warning: 1 line was left out here, as there were more than 1000 in a minute");
}

}  // namespace
}  // namespace probeview
