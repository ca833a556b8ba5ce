// SPDX-License-Identifier: Apache-2.0
//
// Which metrics fill which page: asked of the pages' rules, and tried with every metric that the store takes.
#include <algorithm>
#include <set>

#include "messages/metric_identifiers.h"
#include "store/handlers.h"
#include "tests/store/wire.h"
#include "tests/ui/testing.h"
#include "ui/category_page.h"
#include "ui/category_page_rules.h"
#include "ui/open_page.h"
#include "ui/page_snapshot.h"
#include "ui/second_level_view_controller.h"
#include "ui/varnet_view_items.h"

namespace probeview {
namespace {

// A message with every field, every list with two entries.
Wire fullMessage(const MessageDescriptor& message) {
  Wire wire;
  for (const auto& field : message.fields()) {
    switch (field.kind) {
      case FieldKind::UInt64:
      case FieldKind::UInt32:
      case FieldKind::Int32:
      case FieldKind::Enumeration:
      case FieldKind::Bool:
        wire.varint(field.number, 1);
        break;
      case FieldKind::SInt32:
        wire.sint(field.number, 1);
        break;
      case FieldKind::Bytes:
      case FieldKind::Text:
        wire.bytes(field.number, "1");
        break;
      case FieldKind::Message:
        wire.message(field.number, fullMessage(*field.element));
        break;
      case FieldKind::RepeatedMessage:
        for (int entry = 0; entry < 2; ++entry) wire.message(field.number, fullMessage(*field.element));
        break;
      case FieldKind::RepeatedUInt32:
        wire.packed(field.number, {1, 1});
        break;
      case FieldKind::RepeatedSInt32:
        wire.packedSigned(field.number, {1, 1});
        break;
    }
  }
  return wire;
}

class PageFeeds : public testing_ui::PagesTest {
 protected:
  static std::vector<std::string> keys() {
    auto keys = navigablePageKeys();
    for (const auto* unreachable : {"UMTS Serving Cell Measurement", "Connected Serv Cell Meas",
                                    "LTE Component Carrier Info", "GSM GPRS Config"}) {
      keys.emplace_back(unreachable);
    }
    return keys;
  }
  static std::map<std::string, PageSnapshot> shownBy(const MetricValidator& store, LineSink& log) {
    std::map<std::string, PageSnapshot> shown;
    for (const auto& key : keys()) {
      CategoryPage page(key, store, log);
      shown[key] = takeSnapshot(page);
    }
    return shown;
  }
};

TEST_F(PageFeeds, APageChangesWithExactlyTheMetricsThatItsRuleNames) {
  std::map<std::string, std::set<std::int64_t>> changedBy;
  for (const auto& metric : metricIdentifiers()) {
    if (!metric.isHandled) continue;
    MetricValidator fresh({.wrapper = nullptr, .console = console, .systemLog = systemLog});
    const auto before = shownBy(fresh, console);
    ASSERT_TRUE(fresh.metricsDidUpdate(
        Dictionary{{"kKeyMetricID", metric.id}, {"kKeyPayload", Value::bytes(fullMessage(*metric.message).payload())}}))
        << metric.name;
    const auto after = shownBy(fresh, console);
    for (const auto& [key, page] : before) {
      if (page != after.at(key)) changedBy[key].insert(metric.id);
    }
  }
  std::size_t fed = 0;
  for (const auto& key : keys()) {
    const auto feed = feedOf(categoryPageRule(key));
    const std::set<std::int64_t> named(feed.begin(), feed.end());
    EXPECT_EQ(named, changedBy[key]) << key;
    EXPECT_EQ(named.size(), feed.size()) << key << " names a metric twice";
    fed += feed.empty() ? 0 : 1;
  }
  // Nothing reports IMSI and IMEISV, two pages of GSM have their cells under other keys, and no handler fills the lists
  // of five pages of LTE.
  EXPECT_EQ(fed, keys().size() - 9u);
}

TEST_F(PageFeeds, EveryMetricThatIsHandledIsKnownByItsDictionary) {
  for (const auto& metric : metricIdentifiers()) {
    if (metric.isHandled) {
      EXPECT_EQ(metricOf(handledMetric(metric.id)->dictionary), metric.id) << metric.name;
    }
  }
  EXPECT_EQ(metricOf(DisplayDictionary::myLTESCellMeasDict), std::nullopt) << "no handler stores into it";
}

TEST_F(PageFeeds, TheListsHaveNoFeedOfTheirOwnAndTheDetailPageHasThatOfThePageItCameFrom) {
  NavigationStack stack(description);
  EXPECT_EQ(feedOfTopPage(stack), std::nullopt);
  stack.tap({"LaunchView", "LTE", std::nullopt});
  EXPECT_EQ(feedOfTopPage(stack), std::nullopt);
  for (const auto& key : navigablePageKeys()) {
    ASSERT_TRUE(openPage(stack, key));
    EXPECT_EQ(feedOfTopPage(stack), feedOf(categoryPageRule(key))) << key;
  }
  ASSERT_TRUE(openPage(stack, "LTE RRC State"));
  EXPECT_EQ(feedOfTopPage(stack), PageFeed{K_LTE_RRC_STATE});
  stack.tap({SecondLevelViewController::cellIdentifier, "state", "IDLE"});
  EXPECT_EQ(stack.topPage().title(), "Detail");
  EXPECT_EQ(feedOfTopPage(stack), PageFeed{K_LTE_RRC_STATE});
  stack.popToRoot();
  EXPECT_EQ(feedOfTopPage(stack), std::nullopt);
}

}  // namespace
}  // namespace probeview
