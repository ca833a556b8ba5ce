// SPDX-License-Identifier: Apache-2.0
//
// What a trace source says of its file and of its arguments.
#include <gmock/gmock.h>

#include "tests/service/sources/trace_source_fixture.h"

namespace probeview {
namespace {

using std::chrono::seconds;
using ::testing::ElementsAre;
using ::testing::HasSubstr;
using ::testing::SizeIs;

TEST_F(TraceSourceTest, BadRowsAreToldWithTheirLinesWhenTheSourceStarts) {
  start("bad\n" + measurement("12.00.00", -90));
  EXPECT_THAT(log.lines, ElementsAre("line 2: has 1 fields, not 26; row skipped"));
}

TEST_F(TraceSourceTest, ThatCellsCannotBeCheckedIsSaidOnceHoweverOftenTheFileIsPlayed) {
  SourceResult result =
      makeTraceSource(write("Timestamp,NetworkMode,RSRP,RSRQ,SNR,State,LACHEX,RAWCELLID,NRxRSRP,NRxRSRQ\n"
                            "2024.03.05_12.00.00,LTE,-,-,-,-,1A,25601,-,-\n") +
                      ",loop");
  ASSERT_EQ(result.error, "");
  source = std::move(result.source);
  source->start(SourceContext{loop, loop, log}, sink);
  listen();
  loop.advance(seconds(60));
  EXPECT_THAT(sink.records, SizeIs(61));
  EXPECT_THAT(log.lines,
              ElementsAre("there is no column NODEHEX and CELLHEX, so cell identities cannot be checked; they "
                          "are taken as they stand"));
}

TEST_F(TraceSourceTest, ManyBadRowsAreToldInFewLines) {
  std::string rows = measurement("12.00.00", -90);
  for (int count = 0; count < 100; ++count) rows += "bad\n";
  start(rows);
  ASSERT_THAT(log.lines, SizeIs(21));
  EXPECT_EQ(log.lines.back(), "and 80 more problems like these");
}

TEST_F(TraceSourceTest, AFileThatIsNoSuchLogIsRefusedWithWhatIsWrong) {
  const std::string path = write("hello\n");
  const SourceResult result = makeTraceSource(path);
  EXPECT_EQ(result.source, nullptr);
  EXPECT_THAT(result.error, HasSubstr("trace file " + path + " is no drive-test log: line 1 must name the columns"));
  EXPECT_THAT(makeTraceSource("/no/such/file.csv").error,
              "trace file /no/such/file.csv cannot be read: No such file or directory");
}

TEST_F(TraceSourceTest, ArgumentsThatAreNotUnderstoodAreRefused) {
  const std::string path = write(traceHeader + measurement("12.00.00", -90));
  for (const char* speed : {"0", "-1", "", "fast", "1x", "nan", "inf", "1e9"}) {
    const SourceResult result = makeTraceSource(path + ",speed=" + speed);
    EXPECT_EQ(result.source, nullptr);
    EXPECT_THAT(result.error, HasSubstr("a speed is a number from 0.001 to 100000")) << speed;
  }
  EXPECT_THAT(makeTraceSource("").error, HasSubstr("it names no file"));
  EXPECT_THAT(makeTraceSource("loop").error, HasSubstr("trace file loop cannot be read"));
}

TEST_F(TraceSourceTest, AFilesNameMayHaveCommas) {
  const std::string path = write(traceHeader + measurement("12.00.00", -90), "a,b.csv");
  EXPECT_EQ(makeTraceSource(path + ",speed=2,loop").error, "");
}

}  // namespace
}  // namespace probeview
