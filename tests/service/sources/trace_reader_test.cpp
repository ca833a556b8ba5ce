// SPDX-License-Identifier: Apache-2.0
#include "service/sources/trace_reader.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <clocale>
#include <filesystem>
#include <fstream>
#include <random>

#include "service/sources/trace_file.h"
#include "tests/service/sources/read_trace.h"
#include "tests/service/sources/trace_rows.h"

namespace probeview {
namespace {

using ::testing::ElementsAre;
using ::testing::HasSubstr;
using ::testing::IsEmpty;

TEST(TraceReader, ReadsEveryColumnOfAnLteRow) {
  const TraceLog log = read(traceHeader + TraceLine{.time = "2024.03.05_12.34.56",
                                                    .mode = "LTE",
                                                    .level = "-95",
                                                    .quality = "-11",
                                                    .snr = "12.5",
                                                    .state = "D",
                                                    .area = "1A2B",
                                                    .cell = "25601",
                                                    .neighbourLevel = "-101.0",
                                                    .neighbourQuality = "-14.5"}
                                              .text());
  ASSERT_EQ(log.rows.size(), 1u);
  const TraceRow& row = log.rows[0];
  EXPECT_EQ(row.line, 2u);
  EXPECT_EQ(row.time, std::chrono::milliseconds(1709642096000));
  EXPECT_EQ(row.technology, TraceTechnology::Lte);
  EXPECT_EQ(row.activity, (TraceActivity{.data = true, .voice = false}));
  EXPECT_EQ(row.cellIdentity, 25601u);
  EXPECT_EQ(row.areaCode, 0x1A2Bu);
  EXPECT_EQ(row.level, -95);
  EXPECT_EQ(row.quality, -11);
  EXPECT_EQ(row.signalToNoise, 12.5);
  EXPECT_EQ(row.neighbourLevel, -101);
  EXPECT_EQ(row.neighbourQuality, -14.5);
  EXPECT_THAT(log.problems, IsEmpty());
}

TEST(TraceReader, ADashAndAnEmptyFieldAreNoValue) {
  for (const char* nothing : {"-", ""}) {
    const TraceLog log = read(traceHeader + TraceLine{.level = nothing,
                                                      .quality = nothing,
                                                      .snr = nothing,
                                                      .state = nothing,
                                                      .area = nothing,
                                                      .cell = nothing,
                                                      .neighbourLevel = nothing,
                                                      .neighbourQuality = nothing}
                                                .text());
    ASSERT_EQ(log.rows.size(), 1u);
    const TraceRow& row = log.rows[0];
    EXPECT_FALSE(row.activity || row.cellIdentity || row.areaCode || row.level || row.quality || row.signalToNoise ||
                 row.neighbourLevel || row.neighbourQuality);
  }
}

TEST(TraceReader, ThePairThatTheLoggerWroteWhenItKnewNothingIsNoValue) {
  for (const char* mode : {"LTE", "UMTS"}) {
    const TraceLog log = read(
        traceHeader +
        TraceLine{
            .mode = mode, .level = "-51.0", .quality = "-24.0", .neighbourLevel = "-51.0", .neighbourQuality = "-24.0"}
            .text());
    EXPECT_FALSE(log.rows[0].level || log.rows[0].quality || log.rows[0].neighbourLevel ||
                 log.rows[0].neighbourQuality);
    const TraceLog half = read(traceHeader + TraceLine{.mode = mode, .level = "-51", .quality = "-10"}.text());
    EXPECT_EQ(half.rows[0].level, -51);
    EXPECT_EQ(half.rows[0].quality, -10);
  }
}

TEST(TraceReader, ANeighbourOfTheDefaultLevelIsOneWithAQualityOfItsOwnAndNoneWithoutInAnyTechnology) {
  const auto neighbour = [](const char* mode, const char* level, const char* quality) {
    return read(traceHeader + TraceLine{.mode = mode, .neighbourLevel = level, .neighbourQuality = quality}.text())
        .rows[0];
  };
  for (const char* mode : {"LTE", "5G", "UMTS", "HSPA+", "GSM", "EDGE"}) {
    for (const char* level : {"-51", "-51.0"}) {
      for (const char* quality : {"-24", "-24.0", "", "-"}) {
        const TraceRow row = neighbour(mode, level, quality);
        EXPECT_FALSE(row.neighbourLevel || row.neighbourQuality) << mode << " " << level << " " << quality;
      }
    }
    EXPECT_EQ(neighbour(mode, "-52.0", "-").neighbourLevel, -52) << mode;
  }
  for (const char* mode : {"LTE", "UMTS"}) {
    const TraceRow row = neighbour(mode, "-51.0", "-9.5");
    EXPECT_EQ(row.neighbourLevel, -51) << mode;
    EXPECT_EQ(row.neighbourQuality, -9.5) << mode;
  }
  const TraceRow row = neighbour("EDGE", "-51", "3");
  EXPECT_EQ(row.neighbourLevel, -51);
  EXPECT_EQ(row.neighbourQuality, 3);
}

TEST(TraceReader, ARowThatIsAtTheLoggersFloorThroughoutHasNoMeasurementOfTheServingCell) {
  const TraceLog log = read(
      traceHeader + TraceLine{.level = "-200", .quality = "-20", .snr = "-30.0", .neighbourLevel = "-99.0"}.text() +
      TraceLine{.mode = "UMTS", .level = "-200", .quality = "-20", .snr = "-30.0"}.text() +
      TraceLine{.level = "-110", .quality = "-20", .snr = "-10.0"}.text());
  EXPECT_FALSE(log.rows[0].level || log.rows[0].quality || log.rows[0].signalToNoise);
  EXPECT_EQ(log.rows[0].neighbourLevel, -99);
  EXPECT_FALSE(log.rows[1].level || log.rows[1].quality || log.rows[1].signalToNoise);
  EXPECT_EQ(log.rows[2].quality, -20) << "of a cell that is measured";
  EXPECT_THAT(log.problems, IsEmpty()) << "the logger knew nothing, and said so in its way";
}

TEST(TraceReader, OnGsmTheLevelAloneSaysThatTheLoggerKnewNothing) {
  const TraceLog log =
      read(traceHeader +
           TraceLine{.mode = "EDGE", .level = "-51", .quality = "3", .neighbourLevel = "-51.0", .neighbourQuality = "-"}
               .text());
  EXPECT_EQ(log.rows[0].level, std::nullopt);
  EXPECT_EQ(log.rows[0].quality, 3);
  EXPECT_EQ(log.rows[0].neighbourLevel, std::nullopt);
}

TEST(TraceReader, EachNetworkModeIsOneOfThreeTechnologies) {
  const auto technology = [](const char* mode) {
    return read(traceHeader + TraceLine{.mode = mode}.text()).rows[0].technology;
  };
  for (const char* mode : {"LTE", "5G"}) EXPECT_EQ(technology(mode), TraceTechnology::Lte);
  for (const char* mode : {"UMTS", "HSDPA", "HSUPA", "HSPA", "HSPA+"}) {
    EXPECT_EQ(technology(mode), TraceTechnology::Umts);
  }
  for (const char* mode : {"GSM", "GPRS", "EDGE"}) EXPECT_EQ(technology(mode), TraceTechnology::Gsm);
  EXPECT_EQ(technology("-"), std::nullopt);
}

TEST(TraceReader, StateIsIdleDataVoiceOrBoth) {
  const auto activity = [](const char* state) {
    return read(traceHeader + TraceLine{.state = state}.text()).rows[0].activity.value();
  };
  EXPECT_TRUE(activity("I").idle());
  EXPECT_EQ(activity("D"), (TraceActivity{true, false}));
  EXPECT_EQ(activity("V"), (TraceActivity{false, true}));
  EXPECT_EQ(activity("VD"), (TraceActivity{true, true}));
  EXPECT_EQ(activity("DV"), (TraceActivity{true, true}));
}

TEST(TraceReader, ANumberThatCannotBeMeasuredIsLeftOutAndReportedWithItsLine) {
  const TraceLog log =
      read(traceHeader + TraceLine{.level = "-95", .neighbourLevel = "-74.0", .neighbourQuality = "-225.0"}.text());
  ASSERT_EQ(log.rows.size(), 1u);
  EXPECT_EQ(log.rows[0].level, -95);
  EXPECT_EQ(log.rows[0].neighbourLevel, -74);
  EXPECT_EQ(log.rows[0].neighbourQuality, std::nullopt);
  EXPECT_THAT(log.problems, ElementsAre("line 2: NRxRSRQ -225.0 is no LTE RSRQ (-34.0 to 2.5 dB), left out"));
}

TEST(TraceReader, OfALongFieldFortyBytesAreReported) {
  const std::string digits(310, '1');
  const std::string forty(40, '1');
  const TraceLog log =
      read(traceHeader + TraceLine{.level = digits.substr(0, 300)}.text() +
           TraceLine{.level = "-0." + std::string(200, '0') + "1e210"}.text() +
           TraceLine{.level = "-95", .area = "1A", .cell = "2561", .cellPart = digits, .nodePart = digits}.text() +
           TraceLine{.level = digits}.text());
  EXPECT_THAT(log.problems, ElementsAre("line 2: RSRP " + forty + "… is no LTE RSRP (-156.0 to -31.0 dBm), left out",
                                        "line 3: RSRP -0." + std::string(37, '0') +
                                            "… is no LTE RSRP (-156.0 to -31.0 dBm), left out",
                                        "line 4: RAWCELLID 2561 is not what NODEHEX \"" + forty + "\"… and CELLHEX \"" +
                                            forty + "\"… make on LTE, cell and area left out",
                                        "line 5: RSRP is \"" + forty + "\"…, not a number; row skipped"));
}

TEST(TraceReader, ABadRowIsReportedWithItsLineAndSkipped) {
  const std::string good = TraceLine{}.text();
  const struct {
    std::string row;
    const char* problem;
  } cases[] = {
      {"1,2,3\n", "line 3: has 3 fields, not 26; row skipped"},
      {TraceLine{.time = "2024-03-05 12:00:00"}.text(),
       "line 3: Timestamp is \"2024-03-05 12:00:00\", not "
       "yyyy.MM.dd_HH.mm.ss; row skipped"},
      {TraceLine{.time = "2024.02.30_12.00.00"}.text(),
       "line 3: Timestamp is \"2024.02.30_12.00.00\", not "
       "yyyy.MM.dd_HH.mm.ss; row skipped"},
      {TraceLine{.time = "2024.03.05_24.00.00"}.text(),
       "line 3: Timestamp is \"2024.03.05_24.00.00\", not "
       "yyyy.MM.dd_HH.mm.ss; row skipped"},
      {TraceLine{.mode = "TETRA"}.text(),
       "line 3: NetworkMode is \"TETRA\", which is no technology that is known; "
       "row skipped"},
      {TraceLine{.state = "DX"}.text(), "line 3: State is \"DX\", not I, D, V or VD; row skipped"},
      {TraceLine{.state = "DD"}.text(), "line 3: State is \"DD\", not I, D, V or VD; row skipped"},
      {TraceLine{.level = "-95dBm"}.text(), "line 3: RSRP is \"-95dBm\", not a number; row skipped"},
      {TraceLine{.level = "nan"}.text(), "line 3: RSRP is \"nan\", not a number; row skipped"},
      {TraceLine{.snr = "1e999"}.text(), "line 3: SNR is \"1e999\", not a number; row skipped"},
      {TraceLine{.neighbourLevel = "\x1b[2J"}.text(), "line 3: NRxRSRP is \"\\u{1b}[2J\", not a number; row skipped"},
      {TraceLine{.cell = "12AB"}.text(), "line 3: RAWCELLID is \"12AB\", not a number; row skipped"},
      {TraceLine{.area = "XYZ"}.text(),
       "line 3: LACHEX is \"XYZ\", not an area code of 16 bits in hexadecimal; row "
       "skipped"},
      {TraceLine{.area = "12345"}.text(),
       "line 3: LACHEX is \"12345\", not an area code of 16 bits in hexadecimal; "
       "row skipped"},
      {std::string(5000, 'x') + "\n", "line 3: is longer than 4096 bytes; row skipped"},
  };
  for (const auto& each : cases) {
    const TraceLog log = read(traceHeader + good + each.row + good);
    EXPECT_EQ(log.rows.size(), 2u);
    EXPECT_THAT(log.problems, ElementsAre(each.problem));
    EXPECT_EQ(log.problemCount, 1u);
  }
}

TEST(TraceReader, AFileThatIsNoSuchLogIsRefusedWithWhatIsWrongWithIt) {
  EXPECT_EQ(refusal(""), "it is empty");
  EXPECT_EQ(refusal("hello\nworld\n"),
            "line 1 must name the columns of a drive-test log; missing: Timestamp, NetworkMode, RSRP, RSRQ, SNR, "
            "State, LACHEX, RAWCELLID, NRxRSRP, NRxRSRQ");
  EXPECT_EQ(refusal("Timestamp,NetworkMode,RSRP,RSRQ,SNR,State,LACHEX,NRxRSRP,NRxRSRQ\n"),
            "line 1 must name the columns of a drive-test log; missing: RAWCELLID");
  EXPECT_EQ(refusal("Timestamp," + traceHeader), "line 1: the column Timestamp is there twice");
  EXPECT_EQ(refusal(traceHeader), "it has a line of column names, but no rows");
  EXPECT_EQ(refusal(traceHeader + "x\n"), "no row is usable; line 2: has 1 fields, not 26; row skipped");
}

TEST(TraceReader, ColumnsAreFoundByNameInAnyOrder) {
  const TraceLog log = read(
      "RAWCELLID,State,Timestamp,SNR,RSRP,Extra,RSRQ,LACHEX,NRxRSRQ,NRxRSRP,NetworkMode\n"
      "25601,I,2024.03.05_12.00.00,3.0,-90,?,-9,1A,-12,-99,5G\n");
  ASSERT_EQ(log.rows.size(), 1u);
  EXPECT_EQ(log.rows[0].cellIdentity, 25601u);
  EXPECT_EQ(log.rows[0].level, -90);
  EXPECT_EQ(log.rows[0].neighbourLevel, -99);
}

TEST(TraceReader, LineEndsOfOtherSystemsAByteOrderMarkAndAMissingLastLineEndAreFine) {
  std::string text = "\xEF\xBB\xBF" + traceHeader + TraceLine{}.text() + "\n" + TraceLine{}.text();
  text.pop_back();
  for (std::size_t at = 0; (at = text.find('\n', at)) != std::string::npos; at += 2) text.insert(at, "\r");
  const TraceLog log = read(text);
  EXPECT_EQ(log.rows.size(), 2u);
  EXPECT_EQ(log.rows[1].line, 4u);
  EXPECT_THAT(log.problems, IsEmpty());
}

TEST(TraceReader, TwentyProblemsAreKeptAndOneMoreIsOnlyCounted) {
  std::string text = traceHeader + TraceLine{}.text();
  for (int count = 0; count < 20; ++count) text += "bad\n";
  TraceLog log = read(text);
  EXPECT_EQ(log.problemCount, 20u);
  EXPECT_EQ(log.problems.size(), 20u);
  log = read(text + "bad\n");
  EXPECT_EQ(log.problemCount, 21u);
  EXPECT_EQ(log.problems.size(), 20u);
  EXPECT_THAT(log.problems.back(), HasSubstr("line 22: "));
}

TEST(TraceReader, ALineOfTheLongestLengthIsReadAndOneByteMoreIsSkipped) {
  // A column that nobody reads, as long as it takes.
  const auto lineOf = [](std::size_t length) {
    const std::string row = TraceLine{}.text();
    const std::size_t comma = row.find(',');
    return row.substr(0, comma + 1) + std::string(length - (row.size() - 1), '0') + row.substr(comma + 1);
  };
  ASSERT_EQ(lineOf(4096).size(), 4097u) << "with its line end";
  TraceLog log = read(traceHeader + lineOf(4096));
  EXPECT_EQ(log.rows.size(), 1u);
  EXPECT_THAT(log.problems, IsEmpty());
  log = read(traceHeader + TraceLine{}.text() + lineOf(4097));
  EXPECT_EQ(log.rows.size(), 1u);
  EXPECT_THAT(log.problems, ElementsAre("line 3: is longer than 4096 bytes; row skipped"));
}

TEST(TraceReader, ALogOfHalfAMillionRowsIsReadAndOneRowMoreIsRefused) {
  std::string text = "Timestamp,NetworkMode,RSRP,RSRQ,SNR,State,LACHEX,RAWCELLID,NRxRSRP,NRxRSRQ\n";
  const std::string row = "2024.03.05_12.00.00,LTE,-,-,-,-,-,-,-,-\n";
  text.reserve(text.size() + 500'001 * row.size());
  for (int count = 0; count < 500'000; ++count) text += row;
  {
    const TraceLog log = read(text);
    EXPECT_EQ(log.rows.size(), 500'000u);
    EXPECT_THAT(log.problems, IsEmpty());
  }
  EXPECT_EQ(refusal(text + row), "line 500002: more than 500000 rows; split the log");
}

TEST(TraceReader, RandomBytesAreSurvived) {
  std::mt19937 random(20240305);
  std::uniform_int_distribution<int> byte(0, 255);
  for (int round = 0; round < 200; ++round) {
    std::string bytes(4096, '\0');
    for (char& each : bytes) each = static_cast<char>(byte(random));
    EXPECT_NE(refusal(bytes), "");
    const TraceLog log = read(traceHeader + TraceLine{}.text() + bytes);
    EXPECT_LE(log.problems.size(), 2 * traceProblemsKept);
  }
}

TEST(TraceReader, DamagedRowsAreSurvived) {
  std::mt19937 random(7);
  const std::string whole =
      TraceLine{.level = "-95", .quality = "-11", .snr = "3.0", .state = "VD", .area = "1A", .cell = "2561"}.text();
  for (int round = 0; round < 20'000; ++round) {
    std::string row = whole;
    row[random() % row.size()] = static_cast<char>(random());
    row.erase(random() % row.size(), random() % 3);
    const TraceLogResult result = readTraceLog(traceHeader + row);
    EXPECT_TRUE(result.log.has_value() || !result.error.empty());
  }
}

TEST(TraceReader, ACommaDecimalLocaleChangesNothing) {
  const bool found = std::setlocale(LC_ALL, "de_DE.UTF-8") != nullptr;
  EXPECT_EQ(read(traceHeader + TraceLine{.snr = "12.5"}.text()).rows[0].signalToNoise, 12.5);
  std::setlocale(LC_ALL, "C");
  if (!found) GTEST_SKIP() << "no comma-decimal locale is installed here";
}

TEST(TraceReader, AFileThatCannotBeReadIsRefusedWithTheReason) {
  EXPECT_EQ(readTraceFile("/no/such/file.csv").error, "No such file or directory");
  EXPECT_EQ(readTraceFile("/").error, "it is no regular file");
  EXPECT_EQ(readTraceFile("/dev/null").error, "it is no regular file");
  const std::string path = ::testing::TempDir() + "/large_trace.csv";
  std::ofstream(path).close();
  std::filesystem::resize_file(path, traceFileSizeLimit + 1);
  EXPECT_THAT(readTraceFile(path).error, HasSubstr("more than the 33554432 that a trace may have; split it"));
  std::filesystem::resize_file(path, traceFileSizeLimit);
  EXPECT_EQ(readTraceFile(path).error, "");
  std::filesystem::remove(path);
}

}  // namespace
}  // namespace probeview
