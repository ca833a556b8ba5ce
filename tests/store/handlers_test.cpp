// SPDX-License-Identifier: Apache-2.0
//
// What holds for every handler, over the second opinion on all of them.
#include <gtest/gtest.h>

#include <algorithm>
#include <set>

#include "messages/metric_identifiers.h"
#include "store/handlers.h"
#include "tests/store/store_fixture.h"
#include "tests/support/second_opinion.h"

namespace probeview {
namespace {

// When a handler writes its line: with the timestamp as it came, or as text.
enum class Line { BeforeRewriting, AfterTimestamp };

using Said = SecondOpinion::Metric;

struct Row : Said {
  DisplayDictionary which;
  Line line;
};

void PrintTo(const Row& row, std::ostream* out) { *out << row.constant; }

using enum DisplayDictionary;

std::vector<Row> rowsOf(const SecondOpinion& said) {
  std::vector<Row> rows;
  for (const Said& metric : said.metrics) {
    const bool isEarly = metric.constant == "K_LTE_SEL_RESEL_INFO" || metric.constant == "K_LTE_RSRP_RSRQ_SINR";
    rows.push_back({metric, displayDictionaryNamed(metric.dictionary).value(),
                    isEarly ? Line::BeforeRewriting : Line::AfterTimestamp});
  }
  return rows;
}

class EveryHandler : public StoreTest, public testing::WithParamInterface<Row> {
 protected:
  const std::optional<Dictionary>& stored() const { return store_.displayDictionary(GetParam().which); }
};

TEST_P(EveryHandler, HasTheIdentifierOfTheMetricService) {
  EXPECT_EQ(metricNamed(GetParam().constant)->id, GetParam().id);
}

TEST_P(EveryHandler, FillsItsDisplayDictionaryAndNoOther) {
  EXPECT_TRUE(send(GetParam().id, Wire().varint(1, someTime)));
  for (std::size_t index = 0; index < displayDictionaryCount; ++index) {
    const auto which = static_cast<DisplayDictionary>(index);
    EXPECT_EQ(store_.displayDictionary(which).has_value(), which == GetParam().which) << displayDictionaryName(which);
  }
}

TEST_P(EveryHandler, StoresTheTimestampAsText) {
  send(GetParam().id, Wire().varint(1, someTime));
  EXPECT_EQ(printed(*stored()), R"(["timestamp": "2024-03-05 12:00:00 UTC"])");
}

TEST_P(EveryHandler, WritesItsPrefixDirectlyFollowedByTheDictionaryAtItsPlace) {
  const std::string expected = GetParam().line == Line::BeforeRewriting
                                   ? GetParam().prefix + R"(["timestamp": 1709640000123])"
                                   : GetParam().prefix + R"(["timestamp": "2024-03-05 12:00:00 UTC"])";
  EXPECT_EQ(linesOf(GetParam().id, Wire().varint(1, someTime)), (Lines{expected}));
}

TEST_P(EveryHandler, TakesAnEmptyPayloadAsAMessageWithoutFields) {
  EXPECT_EQ(linesOf(GetParam().id, {}), (Lines{GetParam().prefix + "[]"}));
  EXPECT_TRUE(stored()->empty());
}

TEST_P(EveryHandler, ReplacesItsDictionaryWhole) {
  send(GetParam().id, Wire().varint(1, someTime));
  send(GetParam().id, {});
  EXPECT_TRUE(stored()->empty());
}

TEST_P(EveryHandler, StopsTheProgramWhenThePayloadDoesNotDecode) {
  const std::uint8_t truncated[] = {0x08};
  const Dictionary event{{"kKeyMetricID", GetParam().id}, {"kKeyPayload", Value::bytes(truncated)}};
  EXPECT_TRUE(reasonOfStop([&] { store_.metricsDidUpdate(event); }).has_value());
  EXPECT_EQ(console_.lines.size(), 1u);
  EXPECT_EQ(stored(), std::nullopt);
}

INSTANTIATE_TEST_SUITE_P(Store, EveryHandler, testing::ValuesIn(rowsOf(secondOpinion())),
                         [](const auto& instance) { return instance.param.constant; });

TEST(Handlers, AreThoseOfTheSecondOpinionEachWithADictionaryOfItsOwn) {
  std::set<std::int64_t> identifiers;
  std::set<DisplayDictionary> dictionaries;
  for (const auto family : {lteHandlers(), umtsHandlers(), gsmHandlers(), nasHandlers()}) {
    for (const MetricHandler& handler : family) {
      identifiers.insert(handler.metricID);
      dictionaries.insert(handledMetric(handler.metricID)->dictionary);
    }
  }
  std::set<std::int64_t> said;
  for (const Said& metric : secondOpinion().metrics) said.insert(metric.id);
  EXPECT_EQ(identifiers, said);
  EXPECT_EQ(dictionaries.size(), said.size());
  EXPECT_EQ(displayDictionaryCount, said.size() + 1);
  EXPECT_FALSE(dictionaries.contains(myLTESCellMeasDict));
}

TEST(Handlers, AreChosenByExactIdentifier) {
  for (const Said& said : secondOpinion().metrics) {
    const HandledMetric* metric = handledMetric(said.id);
    ASSERT_NE(metric, nullptr) << said.constant;
    EXPECT_EQ(metric->handler.metricID, said.id);
    EXPECT_EQ(metric->message->name, said.message);
    EXPECT_EQ(handledMetric(-said.id), nullptr);
  }
  EXPECT_EQ(handledMetric(K_LTE_RLF), nullptr);
  EXPECT_EQ(handledMetric(K_LTE_SCELL_MEAS), nullptr);
  EXPECT_EQ(handledMetric(std::numeric_limits<std::int64_t>::max()), nullptr);
  EXPECT_EQ(handledMetric(std::numeric_limits<std::int64_t>::min()), nullptr);
}

TEST(Handlers, AreExactlyTheMetricsThatAreNamedAsHandled) {
  for (const MetricIdentifier& metric : metricIdentifiers()) {
    EXPECT_EQ(handledMetric(metric.id) != nullptr, metric.isHandled) << metric.name;
  }
}

TEST(DisplayDictionaries, StandInTheirOrder) {
  EXPECT_TRUE(std::ranges::equal(displayDictionaryNames, secondOpinion().dictionaries));
}

TEST(DisplayDictionaries, AreFoundByTheirNames) {
  for (std::size_t index = 0; index < displayDictionaryCount; ++index) {
    EXPECT_EQ(displayDictionaryNamed(displayDictionaryNames[index]), static_cast<DisplayDictionary>(index));
  }
  EXPECT_EQ(displayDictionaryNamed("myLTE"), std::nullopt);
  EXPECT_EQ(displayDictionaryName(myUMTSNbrMeasDict), "myUMTSNbrMeasDict");
}

}  // namespace
}  // namespace probeview
