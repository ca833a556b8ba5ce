// SPDX-License-Identifier: Apache-2.0
#include <gtest/gtest.h>

#include "messages/metric_identifiers.h"
#include "tests/store/store_fixture.h"

namespace probeview {
namespace {

using NasHandlers = StoreTest;

TEST_F(NasHandlers, BeforeTheFirstMetricBothListsHoldThePlaceholder) {
  EXPECT_EQ(printed(store_.myCommon().activeBearer), placeholder);
  EXPECT_EQ(printed(store_.myCommon().simContents), placeholder);
}

TEST_F(NasHandlers, TheMmCommonInfoPrefixEndsInIsBlankColonBlank) {
  EXPECT_EQ(linesOf(K_CELLULAR_MM_INFO, Wire().bytes(2, "\x09\x10\x10")),
            (Lines{R"(Received MM Common Info Dict is : ["imsi": <091010>])"}));
}

TEST_F(NasHandlers, TheEmmContextFlattensGutiAndTrackingAreasBeforeItsLine) {
  const Wire area = Wire().bytes(1, std::string_view("\x00\xf1\x10", 3)).varint(2, 4660);
  EXPECT_EQ(linesOf(K_LTE_EMM_CTXT, timed()
                                        .message(5, area)
                                        .message(5, Wire().varint(2, 1))
                                        .message(6, Wire().varint(1, 32769).varint(2, 1).varint(3, 77))),
            (Lines{R"(Received EMM Context is ["timestamp": "2024-03-05 12:00:00 UTC", )"
                   R"("tai_list": "[[\"encoded_plmn\": <00f110>, \"tac\": 4660], [\"tac\": 1]]", )"
                   R"("guti": "[\"mmegi\": 32769, \"mmec\": 1, \"m_tmsi\": 77]"])"}));
  EXPECT_EQ(*store_.myLTEEMMContextDict()->find("guti"), Value::text(R"(["mmegi": 32769, "mmec": 1, "m_tmsi": 77])"));
  EXPECT_EQ(*store_.myLTEEMMContextDict()->find("tai_list"),
            Value::text(R"([["encoded_plmn": <00f110>, "tac": 4660], ["tac": 1]])"));
}

TEST_F(NasHandlers, AnEmptyGutiIsFlattenedToAnEmptyBracketPair) {
  send(K_LTE_EMM_CTXT, Wire().message(6, {}));
  EXPECT_EQ(*store_.myLTEEMMContextDict()->find("guti"), Value::text("[]"));
}

TEST_F(NasHandlers, AnEmmContextWithoutGutiKeepsTheOtherKeysAndGutiStaysAbsent) {
  send(K_LTE_EMM_CTXT, Wire().varint(2, 0).varint(9, 3240));
  EXPECT_EQ(printed(*store_.myLTEEMMContextDict()),
            R"(["reg_status": "KREG_STATUS_NORMAL_SERVICE", "t3412_dur_s": 3240])");
}

TEST_F(NasHandlers, AreaIdentitiesOfTheOtherContextsStayDictionaries) {
  send(K_CELLULAR_MM_CTXT, Wire().message(4, Wire().varint(2, 7)));
  EXPECT_EQ(printed(*store_.myMMContextDict()), R"(["lai": ["lac": 7]])");
  send(K_CELLULAR_GMM_CTXT, Wire().message(4, Wire().varint(3, 7).varint(4, 1)));
  EXPECT_EQ(printed(*store_.myGMMContextDict()), R"(["rai": ["lac": 7, "rac": 1]])");
}

TEST_F(NasHandlers, BearersAreLoggedFirstAndThenStoredWithTheTimestamp) {
  EXPECT_EQ(
      linesOf(K_CELLULAR_ACTIVE_BEARER, timed().varint(2, 9).message(3, Wire().varint(1, 1).bytes(3, "internet"))),
      (Lines{R"(Received Bearer Context Info is ["timestamp": "2024-03-05 12:00:00 UTC", "bearer_context_count": 9, )"
             R"("bearer_contexts": [["cid": 1, "apn": "internet"]]])"}));
  EXPECT_EQ(printed(store_.myCommon().activeBearer),
            R"([["cid": 1, "apn": "internet", "timestamp": "2024-03-05 12:00:00 UTC"]])");
}

TEST_F(NasHandlers, ABearerMetricWithoutBearersLeavesThemUnchangedAndOneWithTwoLeavesExactlyTwo) {
  send(K_CELLULAR_ACTIVE_BEARER, timed().varint(2, 0));
  EXPECT_EQ(printed(store_.myCommon().activeBearer), placeholder);
  Wire five;
  for (std::uint64_t cid = 1; cid <= 5; ++cid) five.message(3, Wire().varint(1, cid));
  send(K_CELLULAR_ACTIVE_BEARER, five);
  EXPECT_EQ(store_.myCommon().activeBearer.size(), 5u);
  send(K_CELLULAR_ACTIVE_BEARER, Wire().message(3, Wire().varint(1, 8)).message(3, Wire().varint(1, 9)));
  EXPECT_EQ(printed(store_.myCommon().activeBearer), R"([["cid": 8], ["cid": 9]])");
  send(K_CELLULAR_ACTIVE_BEARER, timed());
  EXPECT_EQ(printed(store_.myCommon().activeBearer), R"([["cid": 8], ["cid": 9]])");
}

TEST_F(NasHandlers, SimContentsCarryExactlyTheKeysOfTheFilesWithoutATimestamp) {
  EXPECT_EQ(linesOf(K_SIM_FILE_INFO,
                    timed().message(2, Wire().varint(1, 0x6F07).bytes(2, "\x08\x09")).message(2, Wire().varint(1, 1))),
            (Lines{R"(Received SIM Card File Info is ["timestamp": "2024-03-05 12:00:00 UTC", )"
                   R"("ef_list": [["ef_id": 28423, "content": <0809>], ["ef_id": 1]]])"}));
  EXPECT_EQ(printed(store_.myCommon().simContents), R"([["ef_id": 28423, "content": <0809>], ["ef_id": 1]])");
}

TEST_F(NasHandlers, ASimMetricWithoutFilesLeavesThemUnchanged) {
  send(K_SIM_FILE_INFO, timed());
  EXPECT_EQ(printed(store_.myCommon().simContents), placeholder);
  send(K_SIM_FILE_INFO, Wire().message(2, Wire().varint(1, 1)));
  send(K_SIM_FILE_INFO, timed());
  EXPECT_EQ(printed(store_.myCommon().simContents), R"([["ef_id": 1]])");
}

TEST_F(NasHandlers, ATextOfABearerThatIsNotUtf8OrHoldsALineEndKeepsTheLogLineALine) {
  EXPECT_EQ(linesOf(K_CELLULAR_ACTIVE_BEARER, Wire().message(3, Wire().bytes(3, "a\n\xff\"b"))),
            (Lines{"Received Bearer Context Info is [\"bearer_contexts\": [[\"apn\": \"a\\n\xEF\xBF\xBD\\\"b\"]]]"}));
}

}  // namespace
}  // namespace probeview
