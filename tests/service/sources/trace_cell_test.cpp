// SPDX-License-Identifier: Apache-2.0
#include "service/sources/trace_cell.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "tests/service/sources/read_trace.h"
#include "tests/service/sources/trace_rows.h"

namespace probeview {
namespace {

using ::testing::ElementsAre;
using ::testing::EndsWith;
using ::testing::HasSubstr;

TEST(TraceCell, ACellIdentityHasTheWidthOfItsTechnology) {
  const auto cell = [](const char* mode, const char* identity) {
    return read(traceHeader + TraceLine{.mode = mode, .area = "10", .cell = identity}.text()).rows[0].cellIdentity;
  };
  EXPECT_EQ(cell("LTE", "268435455"), 0xFFFFFFFu);
  EXPECT_EQ(cell("LTE", "268435456"), std::nullopt);
  EXPECT_EQ(cell("HSPA+", "838585"), 838585u);
  EXPECT_EQ(cell("EDGE", "65535"), 65535u);
  EXPECT_EQ(cell("EDGE", "838535"), std::nullopt);
  EXPECT_EQ(cell("LTE", "0"), std::nullopt);
}

TEST(TraceCell, ARowWithoutAnAreaNamesNoCellEither) {
  for (const char* area : {"0", "0000", "FFFE"}) {
    const TraceLog log = read(traceHeader + TraceLine{.area = area, .cell = "840685"}.text());
    EXPECT_EQ(log.rows[0].areaCode, std::nullopt);
    EXPECT_EQ(log.rows[0].cellIdentity, std::nullopt);
  }
}

TEST(TraceCell, ACellIsKnownWhereNodeAndCellMakeItUpInTheWayOfItsTechnology) {
  const struct {
    const char* mode;
    const char* node;
    const char* cell;
    const char* identity;
    bool known;
  } cases[] = {
      {"LTE", "53BEA", "3", "87812611", true},
      {"5G", "53bea", "03", "87812611", true},
      {"LTE", "0", "7", "7", true},
      {"LTE", "53BE9", "103", "87812611", false},    // the cell has 8 bits
      {"LTE", "A9", "9B02", "11115266", false},      // divided as on UMTS
      {"LTE", "C", "CB87", "838535", false},         // a cell of UMTS
      {"LTE", "53BEA", "4", "87812611", false},      // another cell
      {"LTE", "-", "3", "87812611", false},          //
      {"LTE", "", "3", "87812611", false},           //
      {"LTE", "53BEA", "-", "87812611", false},      //
      {"LTE", "53BEG", "3", "87812611", false},      // no number
      {"LTE", "100053BEA", "3", "87812611", false},  // no number of 32 bits
      {"LTE", "0", "0", "0", false},                 // none
      {"HSPA+", "C", "CB87", "838535", true},        //
      {"UMTS", "12D", "9E38", "19766840", true},     //
      {"UMTS", "12D9E", "38", "19766840", false},    // divided as on LTE
      {"UMTS", "B", "1CB87", "838535", false},       // the cell has 16 bits
      {"UMTS", "-", "58A7", "22695", false},         // a cell of GSM
      {"UMTS", "0", "854C", "34124", false},         // a node of 0 is none
      {"UMTS", "0", "0", "0", false},                //
      {"GPRS", "-", "58A7", "22695", true},          //
      {"EDGE", "", "58A7", "22695", true},           //
      {"EDGE", "C", "CB87", "838535", false},        // a cell of UMTS
      {"GSM", "-", "-", "22695", false},             //
      {"GSM", "-", "0", "0", false},                 //
  };
  for (const auto& each : cases) {
    const TraceRow row = read(traceHeader + TraceLine{.mode = each.mode,
                                                      .level = "-95",
                                                      .area = "1A",
                                                      .cell = each.identity,
                                                      .cellPart = each.cell,
                                                      .nodePart = each.node}
                                                .text())
                             .rows.at(0);
    const std::string which = std::string(each.mode) + " " + each.node + " " + each.cell + " " + each.identity;
    EXPECT_EQ(row.cellIdentity.has_value(), each.known) << which;
    EXPECT_EQ(row.areaCode.has_value(), each.known) << which << ": an area without its cell may be another's";
    EXPECT_EQ(row.level, -95) << which;
  }
}

TEST(TraceCell, ARunOfRowsWhoseCellIsNotKnownIsToldOnceAndCounted) {
  const TraceLine good{.mode = "HSPA+", .area = "75AA", .cell = "843594"};
  const TraceLine gsm{.mode = "HSPA+", .area = "75AA", .cell = "22695", .cellPart = "58A7", .nodePart = "-"};
  const TraceLine none{.mode = "HSPA+", .cell = "0"};
  const TraceLine noNode{.mode = "UMTS", .area = "3FE", .cell = "34124"};
  const TraceLine wide{.mode = "EDGE", .area = "3FE", .cell = "838535", .cellPart = "CB87", .nodePart = "C"};
  const TraceLog log = read(traceHeader + gsm.text() + gsm.text() + "bad\n" + gsm.text() + good.text() + noNode.text() +
                            none.text() + wide.text() + wide.text());
  EXPECT_EQ(log.rows.size(), 8u);
  EXPECT_THAT(
      log.problems,
      ElementsAre("line 2: RAWCELLID 22695 is not what NODEHEX \"-\" and CELLHEX \"58A7\" make on UMTS, cell and "
                  "area left out; so in 3 rows, to line 5",
                  "line 4: has 1 fields, not 26; row skipped",
                  "line 7: RAWCELLID 34124 has the RNC 0 and thus is no cell of UMTS, cell and area left out",
                  "line 9: RAWCELLID 838535 is above 65535 and thus no cell of GSM, cell and area left out; "
                  "so in 2 rows, to line 10"));
  EXPECT_EQ(log.problemCount, 4u);
}

TEST(TraceCell, AnotherCellOfAnotherTechnologyInTheSameRunIsCountedWithIt) {
  const TraceLog log =
      read(traceHeader +
           TraceLine{.mode = "UMTS", .area = "3FE", .cell = "22695", .cellPart = "58A7", .nodePart = "-"}.text() +
           TraceLine{.mode = "EDGE", .area = "3FE", .cell = "838535", .cellPart = "CB87", .nodePart = "C"}.text());
  EXPECT_THAT(log.problems,
              ElementsAre("line 2: RAWCELLID 22695 is not what NODEHEX \"-\" and CELLHEX \"58A7\" make on "
                          "UMTS, cell and area left out; so in 2 rows, to line 3"));
}

TEST(TraceCell, TwentySuchRunsAreKeptBesideTwentyOtherProblemsAndOneMoreIsOnlyCounted) {
  std::string text = traceHeader;
  for (int count = 0; count < 25; ++count) text += "bad\n";
  const TraceLine foreign{.area = "1A", .cell = "838535", .cellPart = "CB87", .nodePart = "C"};
  const std::string run = foreign.text() + foreign.text() + TraceLine{}.text();
  for (int count = 0; count < 20; ++count) text += run;
  TraceLog log = read(text);
  EXPECT_EQ(log.problems.size(), 40u);
  EXPECT_EQ(log.problemCount, 45u);
  EXPECT_THAT(log.problems[19], HasSubstr("line 21: has 1 fields"));
  EXPECT_THAT(log.problems[20], HasSubstr("line 27: RAWCELLID 838535 is not"));
  log = read(text + run);
  EXPECT_EQ(log.problems.size(), 40u);
  EXPECT_EQ(log.problemCount, 46u);
  EXPECT_THAT(log.problems[39], HasSubstr("line 84: RAWCELLID 838535 is not"));
  EXPECT_THAT(log.problems[39], EndsWith("; so in 2 rows, to line 85"));
}

TEST(TraceCell, WithoutTheColumnsOfNodeAndCellIdentitiesAreTakenAsTheyStandAndThatIsSaid) {
  const std::string columns = "Timestamp,NetworkMode,RSRP,RSRQ,SNR,State,LACHEX,RAWCELLID,NRxRSRP,NRxRSRQ";
  const std::string rows =
      "2024.03.05_12.00.00,UMTS,-,-,-,-,1A,22695,-,-%\n"
      "2024.03.05_12.00.00,GSM,-,-,-,-,1A,838535,-,-%\n"
      "2024.03.05_12.00.00,LTE,-,-,-,-,1A,0,-,-%\n";
  const struct {
    const char* columns;
    const char* fields;
    const char* missing;
  } cases[] = {{"", "", "NODEHEX and CELLHEX"}, {",NODEHEX", ",C", "CELLHEX"}, {",CELLHEX", ",CB87", "NODEHEX"}};
  for (const auto& each : cases) {
    std::string text = rows;
    for (std::size_t at = 0; (at = text.find('%')) != std::string::npos;) text.replace(at, 1, each.fields);
    const TraceLog log = read(columns + each.columns + "\n" + text);
    ASSERT_EQ(log.rows.size(), 3u);
    EXPECT_EQ(log.rows[0].cellIdentity, 22695u);
    EXPECT_EQ(log.rows[0].areaCode, 0x1Au);
    EXPECT_EQ(log.rows[1].cellIdentity, std::nullopt) << "which GSM cannot have";
    EXPECT_EQ(log.rows[1].areaCode, std::nullopt);
    EXPECT_EQ(log.rows[2].cellIdentity, std::nullopt) << "0 is none, whatever stands beside it";
    EXPECT_EQ(log.rows[2].areaCode, 0x1Au) << "which nothing contradicts";
    EXPECT_THAT(log.problems,
                ElementsAre("line 3: RAWCELLID 838535 is above 65535 and thus no cell of GSM, cell and area left out"));
    EXPECT_EQ(log.remark, "there is no column " + std::string(each.missing) +
                              ", so cell identities cannot be checked; they are taken as they stand");
  }
  EXPECT_EQ(read(traceHeader + TraceLine{}.text()).remark, "");
  EXPECT_THAT(refusal(columns + ",NODEHEX,NODEHEX\n"), HasSubstr("the column NODEHEX is there twice"));
}

TEST(TraceCell, AnAreaThatIsNotWrittenDownLeavesTheCellItsIdentity) {
  const TraceLog log = read(traceHeader + TraceLine{.area = "-", .cell = "25601"}.text());
  EXPECT_EQ(log.rows[0].cellIdentity, 25601u);
}

}  // namespace
}  // namespace probeview
