// SPDX-License-Identifier: Apache-2.0
//
// A drive-test log through the real service, its socket and the real tool.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>

#include "tests/service/harness/radixd_process.h"
#include "tests/service/harness/temporary_folder.h"
#include "tests/support/golden.h"
#include "tests/support/output_of.h"

namespace probeview {
namespace {

using ::testing::HasSubstr;

class TraceServiceTest : public ::testing::Test {
 protected:
  const TemporaryFolder folder;
  const std::string socket = folder.path() + "/radixd.sock";
  std::string probectl(const std::string& words) {
    return outputOf("timeout 60 " PROBECTL " --socket " + socket + " " + words + " 2>&1");
  }
  // Asks until the answer has come as far as that text, for a minute: a drive goes on only while somebody listens, and
  // how far it has come when a client goes is a matter of luck.
  std::string outputWith(const std::string& words, const std::string& text) {
    const auto deadline = std::chrono::steady_clock::now() + std::chrono::minutes(1);
    std::string output;
    do {
      output = probectl(words);
    } while (output.find(text) == std::string::npos && std::chrono::steady_clock::now() < deadline);
    return output;
  }
};

TEST_F(TraceServiceTest, RowsArriveAsRecordsInTheOrderOfTheDrive) {
  RadixdProcess service({"--socket", socket, "--source", "trace:tests/pages/traces/drive_a.csv,speed=1000"});
  ASSERT_TRUE(service.waitForLog("listening at")) << service.log();
  EXPECT_EQ(probectl("watch --json --count 4"),
            R"({"time":1709640000000,"origin":"trace:drive_a.csv","metric":"K_LTE_SCELL_INFO","id":3948738,)"
            R"("dict":{"timestamp":1709640000000,"cell_id":25601,"tracking_area_code":6699}})"
            "\n"
            R"({"time":1709640000000,"origin":"trace:drive_a.csv","metric":"K_LTE_RRC_STATE","id":3952132,)"
            R"("dict":{"timestamp":1709640000000,"state":"KLTE_RRC_STATE_CONNECTED"}})"
            "\n"
            R"({"time":1709640000000,"origin":"trace:drive_a.csv","metric":"K_LTE_RSRP_RSRQ_SINR","id":3952490,)"
            R"("dict":{"timestamp":1709640000000,"inst_values":[{"rsrp0":-74,"rsrq0":-8,"sinr0":48}]}})"
            "\n"
            R"({"time":1709640000000,"origin":"trace:drive_a.csv","metric":"K_LTE_INTRARAT_MEAS","id":3986191,)"
            R"("dict":{"timestamp":1709640000000,"meas_nbr_eutra":[{"nbr_rsrp":50,"nbr_rsrq":14}]}})"
            "\n");
}

TEST_F(TraceServiceTest, APageShowsWhereTheDriveHasCome) {
  RadixdProcess service({"--socket", socket, "--source", "trace:tests/pages/traces/drive_a.csv,speed=1000"});
  ASSERT_TRUE(service.waitForLog("listening at")) << service.log();
  EXPECT_THAT(outputWith("pages LTE RRC State", "2024-03-05 12:00:04 UTC"),
              HasSubstr("  timestamp          2024-03-05 12:00:04 UTC\n"
                        "  state              KLTE_RRC_STATE_NULL\n"
                        "  prev_state         KLTE_RRC_STATE_IDLE\n"
                        "  prev_state_dur_ms  3000\n"));
}

TEST_F(TraceServiceTest, WhatIsWrongWithAFileEndsTheStartAndIsTold) {
  RadixdProcess missing({"--socket", socket, "--source", "trace:/no/such/file.csv"});
  EXPECT_EQ(missing.waitForEnd(), 1);
  EXPECT_THAT(missing.log(), HasSubstr("trace file /no/such/file.csv cannot be read: No such file or directory"));
  RadixdProcess other({"--socket", socket, "--source", "trace:LICENSE"});
  EXPECT_EQ(other.waitForEnd(), 1);
  EXPECT_THAT(other.log(), HasSubstr("trace file LICENSE is no drive-test log: line 1 must name the columns"));
}

TEST_F(TraceServiceTest, HelpManualAndDocumentationSayWhichStateIsAGuess) {
  // As it is read: line ends are blanks.
  const auto said = [](std::string text) {
    std::replace(text.begin(), text.end(), '\n', ' ');
    return text;
  };
  EXPECT_THAT(said(outputOf(RADIXD_PROGRAM " --help")), HasSubstr("CELL_DCH, which is a guess"));
  EXPECT_THAT(said(contentOf("packaging/man/radixd.8")), HasSubstr("CELL_DCH, which is a guess"));
  EXPECT_THAT(said(contentOf("docs/traces.md")), HasSubstr("**CELL_DCH is a guess.**"));
}

TEST_F(TraceServiceTest, EveryColumnThatIsReadIsDocumented) {
  const std::string manual = contentOf("packaging/man/radixd.8");
  const std::string documentation = contentOf("docs/traces.md");
  for (const char* column : {"Timestamp", "NetworkMode", "RSRP", "RSRQ", "SNR", "State", "LACHEX", "RAWCELLID",
                             "NODEHEX", "CELLHEX", "NRxRSRP", "NRxRSRQ"}) {
    EXPECT_THAT(manual, HasSubstr(column));
    EXPECT_THAT(documentation, HasSubstr("`" + std::string(column) + "`"));
  }
}

TEST_F(TraceServiceTest, ADamagedRowIsInTheLogWithItsLine) {
  RadixdProcess service({"--socket", socket, "--source", "trace:tests/pages/traces/drive_b.csv"});
  EXPECT_TRUE(service.waitForLog("trace:drive_b.csv: line 6: has 1 fields, not 26; row skipped")) << service.log();
  EXPECT_EQ(service.log().find("trace:drive_b.csv: trace:"), std::string::npos) << service.log();
}

}  // namespace
}  // namespace probeview
