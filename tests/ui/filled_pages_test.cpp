// SPDX-License-Identifier: Apache-2.0
//
// The pages of record entries after real metrics have filled the records.
#include <algorithm>
#include <functional>

#include "messages/metric_identifiers.h"
#include "tests/store/wire.h"
#include "tests/ui/testing.h"
#include "ui/category_page.h"
#include "ui/page_snapshot.h"
#include "values/printer.h"

namespace probeview {
namespace {

class FilledPages : public testing_ui::PagesTest {
 protected:
  // Sends the metric with so many elements in the list of that field number; each has one field more than the one
  // before it, as far as its first fields are numbers.
  void sendList(std::int64_t metric, std::uint32_t listNumber, int count) {
    Wire payload;
    payload.varint(1, 1709640000123);
    for (int element = 0; element < count; ++element) {
      Wire content;
      const auto fields = std::min(static_cast<std::uint32_t>(element) + 1, numbersIn(metric));
      for (std::uint32_t field = 1; field <= fields; ++field) content.varint(field, 2);
      payload.message(listNumber, content);
    }
    ASSERT_TRUE(
        store.metricsDidUpdate(Dictionary{{"kKeyMetricID", metric}, {"kKeyPayload", Value::bytes(payload.payload())}}));
  }
  static std::uint32_t numbersIn(std::int64_t metric) {
    if (metric == K_SIM_FILE_INFO) return 1;
    return metric == K_CELLULAR_ACTIVE_BEARER ? 2 : 4;
  }
  PageSnapshot shown(const std::string& key) {
    CategoryPage page(key, store, console);
    return takeSnapshot(page);
  }
  // What the page of an entry list with headers must show, told from the record.
  static PageSnapshot expected(const List& entries, const std::string& prefix) {
    PageSnapshot page;
    for (std::size_t index = 0; index < entries.size(); ++index) {
      auto& section = page.sections.emplace_back();
      section.title = prefix + std::to_string(index);
      for (const auto& [key, value] : *entries[index].dictionary()) {
        section.rows.push_back({"SecondClickView", std::string(key.text()), bareText(value)});
      }
    }
    return page;
  }
};

TEST_F(FilledPages, AnLteNeighbourPageWithThreeEntriesShowsThreeSectionsWithOneRowPerFieldOfEach) {
  sendList(K_LTE_SEL_RESEL_INFO, 21, 3);
  const auto page = shown("LTE EUTRA Neighbor Info");
  ASSERT_EQ(page.sections.size(), 3u);
  for (std::size_t section = 0; section < 3; ++section) {
    EXPECT_EQ(page.sections[section].title, "EUTRA Neighbor " + std::to_string(section));
    EXPECT_EQ(page.sections[section].rows.size(), store.myLTE().EutraNbrs[section].dictionary()->size());
  }
  EXPECT_EQ(page.sections[2].rows.size(), page.sections[0].rows.size() + 2);
}

struct ListCase {
  std::string key;
  std::string prefix;
  std::int64_t metric;
  std::uint32_t listNumber;
  std::function<const List&(const MetricValidator&)> entries;
};

const std::vector<ListCase> listCases = {
    {"LTE EUTRA Neighbor Info", "EUTRA Neighbor ", K_LTE_SEL_RESEL_INFO, 21,
     [](const MetricValidator& store) -> const List& { return store.myLTE().EutraNbrs; }},
    {"LTE CA Status", "Component Carrier ", K_LTE_CA_STATUS, 2,
     [](const MetricValidator& store) -> const List& { return store.myLTE().CAStatusList; }},
    {"UMTS Tx Power", "TxPowerInfo ", K_UMTS_TX_POWER, 2,
     [](const MetricValidator& store) -> const List& { return store.myUMTS().TxPower; }},
    {"UMTS EUTRA Neighbor Info", "EUTRA Neighbor ", K_UMTS_SEL_RESEL_INFO, 22,
     [](const MetricValidator& store) -> const List& { return store.myUMTS().eUtraNbrs; }},
    {"UMTS UTRA Neighbor Info", "UTRA Neighbor ", K_UMTS_SEL_RESEL_INFO, 23,
     [](const MetricValidator& store) -> const List& { return store.myUMTS().utraNbrs; }},
    {"UMTS GSM Neighbor Info", "GSM Neighbor ", K_UMTS_SEL_RESEL_INFO, 24,
     [](const MetricValidator& store) -> const List& { return store.myUMTS().geraNbrs; }},
    {"UMTS UMTS Neighbor Cell Meas", "UMTS Neighbor ", K_UMTS_NCELL_MEAS, 2,
     [](const MetricValidator& store) -> const List& { return store.myUMTS().utraNbrMeas; }},
    {"UMTS GSM Neighbor Cell Meas", "GSM Neighbor ", K_UMTS_NCELL_MEAS, 3,
     [](const MetricValidator& store) -> const List& { return store.myUMTS().geraNbrMeas; }},
    {"UMTS LTE Neighbor Cell Meas", "LTE Neighbor ", K_UMTS_NCELL_MEAS, 4,
     [](const MetricValidator& store) -> const List& { return store.myUMTS().eUtraNbrMeas; }},
    {"GSM GSM Neighbor Cell Meas", "GSM Neighbor ", K_GSM_NCELL_MEAS, 2,
     [](const MetricValidator& store) -> const List& { return store.myGSM().geraNbrMeas; }},
    {"GSM UMTS Neighbor Cell Meas", "UMTS Neighbor ", K_GSM_NCELL_MEAS, 3,
     [](const MetricValidator& store) -> const List& { return store.myGSM().utraNbrMeas; }},
    {"GSM LTE Neighbor Cell Meas", "LTE Neighbor ", K_GSM_NCELL_MEAS, 4,
     [](const MetricValidator& store) -> const List& { return store.myGSM().eUtraNbrMeas; }},
    {"LTE Active Bearers", "PDP ", K_CELLULAR_ACTIVE_BEARER, 3,
     [](const MetricValidator& store) -> const List& { return store.myCommon().activeBearer; }},
    {"UMTS Active Bearers", "PDP ", K_CELLULAR_ACTIVE_BEARER, 3,
     [](const MetricValidator& store) -> const List& { return store.myCommon().activeBearer; }},
    {"GSM Active Bearers", "PDP ", K_CELLULAR_ACTIVE_BEARER, 3,
     [](const MetricValidator& store) -> const List& { return store.myCommon().activeBearer; }},
    {"Device Info SIM Files", "SIM Content ", K_SIM_FILE_INFO, 2,
     [](const MetricValidator& store) -> const List& { return store.myCommon().simContents; }},
};

TEST_F(FilledPages, EveryEntryListPageShowsItsRecordEntryByEntryAndFieldByField) {
  for (const auto& list : listCases) {
    for (const int count : {2, 1, 4}) {
      sendList(list.metric, list.listNumber, count);
      const auto& entries = list.entries(store);
      ASSERT_EQ(entries.size(), static_cast<std::size_t>(count)) << list.key;
      EXPECT_EQ(shown(list.key), expected(entries, list.prefix)) << list.key;
    }
  }
}

TEST_F(FilledPages, UmtsServingCellMeasHasOneSectionPerEntryAndEachRowReadsComeBackLater) {
  sendList(K_UMTS_SCELL_MEAS, 3, 2);
  const auto page = shown("UMTS Serving Cell Meas");
  ASSERT_EQ(page.sections.size(), 2u);
  for (std::size_t section = 0; section < 2; ++section) {
    EXPECT_EQ(page.sections[section].title, "RxInfo " + std::to_string(section));
    EXPECT_EQ(page.sections[section].rows.size(), store.myUMTS().rXInfo[section].dictionary()->size());
    for (const auto& row : page.sections[section].rows) {
      EXPECT_EQ(row.text, "Come back later");
      EXPECT_EQ(row.detail, "Come back later");
    }
  }
}

TEST_F(FilledPages, TheKeyOfTheUmtsReceiveInformationsCellsShowsTheFirstFieldOfTheFirstEntry) {
  sendList(K_UMTS_SCELL_MEAS, 3, 2);
  const auto page = shown("UMTS Serving Cell Measurement");
  const auto& [key, value] = (*store.myUMTS().rXInfo[0].dictionary())[0];
  ASSERT_EQ(page.rowCount(), 1u);
  EXPECT_EQ(page.sections[0].title, std::nullopt);
  EXPECT_EQ(page.sections[0].rows[0], (ListCell{"SecondClickView", std::string(key.text()), bareText(value)}));
}

TEST_F(FilledPages, LteMeasurementsLeaveTheirPagesAtThePlaceholder) {
  sendList(K_LTE_TX_POWER, 2, 2);
  sendList(K_LTE_INTRARAT_MEAS, 2, 2);
  sendList(K_LTE_INTERRAT_MEAS, 2, 2);
  const ListCell waiting{"SecondClickView", "Waiting for Update", "Waiting for Update"};
  EXPECT_EQ(shown("LTE Tx Power"), (PageSnapshot{{{"TxPowerInfo 0", {waiting}}}}));
  EXPECT_EQ(shown("LTE LTE Neighbor Cell Meas"), (PageSnapshot{{{"LTE Neighbor 0", {waiting}}}}));
  EXPECT_EQ(shown("LTE UMTS Neighbor Cell Meas"), (PageSnapshot{{{"UMTS Neighbor 0", {waiting}}}}));
  EXPECT_EQ(shown("LTE GSM Neighbor Cell Meas"), (PageSnapshot{{{"GSM Neighbor 0", {waiting}}}}));
  EXPECT_EQ(shown("LTE Serving Cell Meas"), (PageSnapshot{{{std::nullopt, {waiting}}}}));
}

TEST_F(FilledPages, ReselectionPagesShowTheFieldsOfTheirOneEntry) {
  sendList(K_LTE_SEL_RESEL_INFO, 21, 1);
  sendList(K_UMTS_SEL_RESEL_INFO, 22, 1);
  const auto lte = shown("LTE Sel Resel Parameters");
  const auto umts = shown("UMTS Sel Resel Parameters");
  ASSERT_EQ(lte.rowCount(), 20u);
  ASSERT_EQ(umts.rowCount(), 14u);
  EXPECT_EQ(lte.sections[0].title, std::nullopt);
  EXPECT_EQ(lte.sections[0].rows[0].text, "timestamp");
  EXPECT_NE(lte.sections[0].rows[0].detail, "");
  EXPECT_EQ(umts.sections[0].rows[0].text, "timestamp");
  EXPECT_NE(umts.sections[0].rows[0].detail, "");
}

TEST_F(FilledPages, AListThatShrinksBetweenTwoQuestionsStopsTheProgram) {
  sendList(K_UMTS_TX_POWER, 2, 3);
  CategoryPage page("UMTS Tx Power", store, console);
  EXPECT_EQ(page.numberOfSections(), 3u);
  sendList(K_UMTS_TX_POWER, 2, 1);
  ListCell cell;
  EXPECT_EQ(testing_ui::stopReason([&] { page.cellForRow(2, 0, cell); }),
            "entry 2 asked of UMTS Tx Power, which has 1");
}

}  // namespace
}  // namespace probeview
