// SPDX-License-Identifier: Apache-2.0
#include "service/plans.h"

#include <gtest/gtest.h>

#include <chrono>
#include <vector>

namespace probeview {
namespace {

using std::chrono::milliseconds;

TEST(Plans, WithoutAnyThereIsNone) { EXPECT_EQ(unite({}, false), std::nullopt); }

TEST(Plans, TheUnionHasEachMetricAtTheShortestPeriodWithOnChangeAboveAll) {
  const MetricPlan first{{{1, milliseconds(500)}, {2, std::nullopt}, {3, milliseconds(7)}}};
  const MetricPlan second{{{1, milliseconds(200)}, {2, milliseconds(1)}, {4, std::nullopt}}};
  const std::vector<const MetricPlan*> plans{&first, &second};
  const auto all = unite(plans, false);
  ASSERT_TRUE(all);
  const decltype(MetricPlan::metrics) expected{
      {1, milliseconds(200)}, {2, std::nullopt}, {3, milliseconds(7)}, {4, std::nullopt}};
  EXPECT_EQ(all->metrics, expected);
}

TEST(Plans, SomebodyWhoObservesWantsEverythingBesideThemAndAloneNeedsNone) {
  const MetricPlan plan{{{1, milliseconds(500)}}};
  const std::vector<const MetricPlan*> plans{&plan};
  EXPECT_EQ(unite(plans, true), (MetricPlan{.metrics = plan.metrics, .observed = true}));
  EXPECT_EQ(unite({}, true), std::nullopt);
}

TEST(Plans, AnEmptyPlanIsAPlan) {
  const MetricPlan nothing;
  const std::vector<const MetricPlan*> plans{&nothing};
  const auto all = unite(plans, false);
  ASSERT_TRUE(all);
  EXPECT_TRUE(all->metrics.empty());
}

}  // namespace
}  // namespace probeview
