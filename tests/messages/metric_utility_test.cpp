// SPDX-License-Identifier: Apache-2.0
//
// The numbers of metrics that decoding drops.
#include <gtest/gtest.h>

#include "messages/metric_utility.h"
#include "tests/messages/support.h"
#include "tests/support/second_opinion.h"

namespace probeview {
namespace {

TEST(MetricUtility, KnowsTheNumbersOfItsRowsAndNoOther) {
  std::size_t known = 0;
  for (std::uint32_t number = 0; number <= 0x20000; ++number) known += KBBMetricUtility::isMetricId(number) ? 1 : 0;
  EXPECT_EQ(known, KBBMetricUtility::rows().size());
  for (const KBBMetricUtility::Row& row : KBBMetricUtility::rows()) {
    EXPECT_TRUE(KBBMetricUtility::isMetricId(row.metricId)) << row.name;
  }
}

TEST(MetricUtility, ItsRowsStandInTheirOrderWithTheirOddNames) {
  const auto& said = secondOpinion().tags;
  ASSERT_EQ(KBBMetricUtility::rows().size(), said.size());
  for (std::size_t index = 0; index < said.size(); ++index) {
    EXPECT_EQ(KBBMetricUtility::rows()[index].metricId, said[index].number);
    EXPECT_EQ(KBBMetricUtility::rows()[index].name, said[index].name);
  }
}

TEST(MetricUtility, SaysThatATagIsOneOfAMetric) {
  LineLog log;
  EXPECT_TRUE(KBBMetricUtility::isValidMetricIdTag(0xD30E, "AnyClass", &log));
  EXPECT_FALSE(KBBMetricUtility::isValidMetricIdTag(20, "AnyClass", &log));
  EXPECT_EQ(log.lines, std::vector<std::string>{"valid metricId tag"});
  EXPECT_TRUE(KBBMetricUtility::isValidMetricIdTag(19, "AnyClass"));
}

}  // namespace
}  // namespace probeview
