// SPDX-License-Identifier: Apache-2.0
//
// What each category page shows. The expected answers are written out here key by key, those of pages that show a
// dictionary in the second opinion, apart from the table that the pages answer from.
#include "ui/category_page.h"

#include <set>

#include "tests/support/second_opinion.h"
#include "tests/ui/testing.h"
#include "ui/page_snapshot.h"
#include "ui/second_level_view_controller.h"
#include "ui/varnet_view_items.h"

namespace probeview {
namespace {

using testing_ui::stopReason;

// A page in one line: each section as its header ("-" for none) and its rows, a blank label as "_".
std::string outline(const PageSnapshot& snapshot) {
  std::string out;
  for (const auto& section : snapshot.sections) {
    if (!out.empty()) out += " ";
    out += section.title.value_or("-") + " (";
    for (std::size_t row = 0; row < section.rows.size(); ++row) {
      if (row > 0) out += "; ";
      out += section.rows[row].text.value_or("_") + "=" + section.rows[row].detail.value_or("_");
    }
    out += ")";
  }
  return out;
}

class CategoryPages : public testing_ui::PagesTest {
 protected:
  std::string shown(const std::string& key) {
    CategoryPage page(key, store, console);
    return outline(takeSnapshot(page));
  }
  void receive(std::int64_t metricId, const std::vector<std::uint8_t>& payload) {
    ASSERT_TRUE(store.metricsDidUpdate(Dictionary{{"kKeyMetricID", metricId}, {"kKeyPayload", Value::bytes(payload)}}));
  }
  static Dictionary twoFields(std::string_view tag) {
    Dictionary dictionary;
    dictionary.set(Key::copy(std::string(tag) + "_second"), Value(std::int32_t{-7}));
    dictionary.set(Key::copy(std::string(tag) + "_first"), Value::text("t"));
    return dictionary;
  }
};

const std::string waiting = "Waiting for Update=Waiting for Update";
const std::string comeBackLater = "Come back later=Come back later";

const std::vector<std::pair<std::string, std::string>> shownByAnEmptyStore = {
    {"Device Info IMSI", "- (" + comeBackLater + ")"},
    {"Device Info IMEISV", "- (" + comeBackLater + ")"},
    {"Device Info SIM Files", "SIM Content 0 (" + waiting + ")"},
    {"LTE Serving Cell Info", "- (_=_)"},
    {"LTE Serving Cell Meas", "- (" + waiting + ")"},
    {"LTE Tx Power", "TxPowerInfo 0 (" + waiting + ")"},
    {"LTE Sel Resel Parameters",
     "- (timestamp=; ims_emergency_support=; ac_barring_for_emergency=; mo_signalling_ac_barring_factor=; "
     "mo_signalling_ac_barring_time=; mo_signalling_ac_barring_for_special_ac=; mo_data_ac_barring_factor=; "
     "mo_data_ac_barring_time=; mo_data_ac_barring_for_special_ac=; QRxLevMin=; QQualMin=; Q_hyst=; "
     "S_non_intra_search_P=; S_non_intra_search_Q=; S_intra_search_P=; S_intra_search_Q=; Thresh_serving_lowP=; "
     "Thresh_serving_lowQ=; priority_operating_freq=; multi_band_info=)"},
    {"LTE EUTRA Neighbor Info", "EUTRA Neighbor 0 (" + waiting + ")"},
    {"LTE LTE Neighbor Cell Meas", "LTE Neighbor 0 (" + waiting + ")"},
    {"LTE UMTS Neighbor Cell Meas", "UMTS Neighbor 0 (" + waiting + ")"},
    {"LTE GSM Neighbor Cell Meas", "GSM Neighbor 0 (" + waiting + ")"},
    {"LTE CA Status", "Component Carrier 0 (" + waiting + ")"},
    {"LTE Active Bearers", "PDP 0 (" + waiting + ")"},
    {"UMTS Serving Cell Meas", "RxInfo 0 (" + comeBackLater + ")"},
    {"UMTS Tx Power", "TxPowerInfo 0 (" + waiting + ")"},
    {"UMTS Sel Resel Parameters",
     "- (timestamp=; ims_emergency_support=; hsdpa_capable=; edch_capable=; duplex_mode=; cell_barred=; "
     "fach_meas_occ_info_present=; s_rxlev=; s_qual=; s_intrasearch=; s_intersearch=; s_search_rat=; s_cell_prio=; "
     "multi_band_info=)"},
    {"UMTS EUTRA Neighbor Info", "EUTRA Neighbor 0 (" + waiting + ")"},
    {"UMTS UTRA Neighbor Info", "UTRA Neighbor 0 (" + waiting + ")"},
    {"UMTS GSM Neighbor Info", "GSM Neighbor 0 (" + waiting + ")"},
    {"UMTS LTE Neighbor Cell Meas", "LTE Neighbor 0 (" + waiting + ")"},
    {"UMTS UMTS Neighbor Cell Meas", "UMTS Neighbor 0 (" + waiting + ")"},
    {"UMTS GSM Neighbor Cell Meas", "GSM Neighbor 0 (" + waiting + ")"},
    {"UMTS Active Bearers", "PDP 0 (" + waiting + ")"},
    {"GSM Connected Serv Cell Meas", "- (" + comeBackLater + ")"},
    {"GSM GSM GPRS Config", "- (" + comeBackLater + ")"},
    {"GSM LTE Neighbor Cell Meas", "LTE Neighbor 0 (" + waiting + ")"},
    {"GSM UMTS Neighbor Cell Meas", "UMTS Neighbor 0 (" + waiting + ")"},
    {"GSM GSM Neighbor Cell Meas", "GSM Neighbor 0 (" + waiting + ")"},
    {"GSM Active Bearers", "PDP 0 (" + waiting + ")"},
    // Never joined by the lists.
    {"UMTS Serving Cell Measurement", "- (" + waiting + ")"},
    {"Connected Serv Cell Meas", "- (_=_)"},
    {"LTE Component Carrier Info", "- (_=_)"},
    {"GSM GPRS Config", "- (_=_)"},
    // Unknown; comparison is exact and knows case.
    {"", "- (" + comeBackLater + ")"},
    {" ", "- (" + comeBackLater + ")"},
    {"LTE", "- (" + comeBackLater + ")"},
    {"LTE tx power", "- (" + comeBackLater + ")"},
    {"LTE Tx Power ", "- (" + comeBackLater + ")"},
    {"NR Tx Power", "- (" + comeBackLater + ")"},
};

// The pages that show a dictionary, by the rule: all of its entries or the first alone.
std::vector<std::pair<std::string, DisplayDictionary>> pagesOf(std::string_view rule) {
  std::vector<std::pair<std::string, DisplayDictionary>> pages;
  for (const SecondOpinion::Page& page : secondOpinion().pages) {
    if (page.rule != rule) continue;
    pages.emplace_back(page.technology + " " + page.category, displayDictionaryNamed(page.dictionary).value());
  }
  return pages;
}

TEST_F(CategoryPages, OfADictionaryShowNothingOrABlankPairOfAnEmptyStore) {
  for (const auto& [key, dictionary] : pagesOf("all")) {
    if (key != "LTE Serving Cell Info") {  // which has a row in its place, and complains
      EXPECT_EQ(shown(key), "- ()") << key;
    }
  }
  for (const auto& [key, dictionary] : pagesOf("first")) EXPECT_EQ(shown(key), "- (_=_)") << key;
}

TEST_F(CategoryPages, EveryOtherKeyShowsWhatAnEmptyStoreGives) {
  for (const auto& [key, expected] : shownByAnEmptyStore) EXPECT_EQ(shown(key), expected) << key;
}

TEST_F(CategoryPages, EveryKeyThatTheListsJoinIsAmongThese) {
  std::set<std::string> known;
  for (const auto rule : {"all", "first"}) {
    for (const auto& [key, dictionary] : pagesOf(rule)) known.insert(key);
  }
  for (const auto& [key, expected] : shownByAnEmptyStore) known.insert(key);
  for (const auto& key : navigablePageKeys()) EXPECT_TRUE(known.contains(key)) << key;
}

TEST_F(CategoryPages, ADictionaryPageHasOneRowPerEntryInTheDictionarysOwnOrder) {
  for (const auto& [key, dictionary] : pagesOf("all")) {
    const auto name = displayDictionaryName(dictionary);
    store.filled[dictionary] = twoFields(name);
    EXPECT_EQ(shown(key), "- (" + std::string(name) + "_second=-7; " + std::string(name) + "_first=t)") << key;
    store.filled[dictionary] = Dictionary{};
    EXPECT_EQ(shown(key), "- ()") << key;
    store.filled.clear();
  }
  EXPECT_EQ(console.lines, std::vector<std::string>{});
}

TEST_F(CategoryPages, AGsmDictionaryPageShowsTheFirstPairAlone) {
  auto pages = pagesOf("first");
  // Keys of cells alone behave the same.
  pages.emplace_back("GSM GPRS Config", DisplayDictionary::myGSMGPRSConfigDict);
  pages.emplace_back("Connected Serv Cell Meas", DisplayDictionary::myGSMConnRfMeasDict);
  pages.emplace_back("LTE Component Carrier Info", DisplayDictionary::myLTECompCarrDict);
  for (const auto& [key, dictionary] : pages) {
    store.filled[dictionary] = twoFields("field");
    EXPECT_EQ(shown(key), "- (field_second=-7)") << key;
    store.filled.clear();
  }
}

TEST_F(CategoryPages, AnEmptyButPresentGsmDictionaryHasOneRowAskedAndNoneThereWhichStopsTheProgram) {
  store.filled[DisplayDictionary::myGSMIdleConfigInfoDict] = Dictionary{};
  EXPECT_EQ(stopReason([&] { shown("GSM Idle Config"); }), "row 0 asked of GSM Idle Config, which has 0");
}

TEST_F(CategoryPages, DictionariesOfPagesThatFallBackAreNotShown) {
  for (std::size_t index = 0; index < displayDictionaryCount; ++index) {
    store.filled[static_cast<DisplayDictionary>(index)] = twoFields("field");
  }
  for (const std::string key :
       {"Device Info IMSI", "Device Info IMEISV", "GSM Connected Serv Cell Meas", "GSM GSM GPRS Config", "GSM"}) {
    EXPECT_EQ(shown(key), "- (" + comeBackLater + ")") << key;
  }
}

TEST_F(CategoryPages, WithoutItsDictionaryTheLteServingCellPageComplainsOnceForEachTimeItsRowsAreCounted) {
  CategoryPage page("LTE Serving Cell Info", store, console);
  takeSnapshot(page);
  EXPECT_EQ(console.lines, std::vector<std::string>{"You are screwed"});
  EXPECT_EQ(page.numberOfRowsInSection(0), 1u);
  EXPECT_EQ(console.lines.size(), 2u);
  ListCell cell;
  page.cellForRowAtIndexPath(0, 0, cell);
  EXPECT_EQ(console.lines.size(), 2u) << "its cell does not complain";
  store.filled[DisplayDictionary::myLTESCellInfoDict] = twoFields("field");
  takeSnapshot(page);
  EXPECT_EQ(console.lines.size(), 2u);
}

TEST_F(CategoryPages, NoOtherPageComplains) {
  for (const auto& [key, expected] : shownByAnEmptyStore) {
    if (key != "LTE Serving Cell Info") shown(key);
  }
  EXPECT_EQ(console.lines, std::vector<std::string>{});
}

TEST_F(CategoryPages, LteServingCellMeasShowsOnlyTheFirstEntryWithNoHeader) {
  CategoryPage page("LTE Serving Cell Meas", store, console);
  EXPECT_EQ(page.numberOfSectionsInTableView(), 1u);
  EXPECT_EQ(page.titleForHeaderInSection(0), std::nullopt);
  EXPECT_EQ(page.numberOfRowsInSection(0), store.myLTE().RsrpRsrqSinr[0].dictionary()->size());
}

TEST_F(CategoryPages, ALteNeighbourPageWithThreeEntriesShowsThreeSectionsEachWithOneRowPerField) {
  // Three nbr_eutra: earfcn 1300; earfcn 1300 and priority 7; earfcn 1300, priority 7 and frame_type 1.
  receive(0x3CD30E, {0xaa, 0x01, 0x03, 0x08, 0x94, 0x0a,              //
                     0xaa, 0x01, 0x05, 0x08, 0x94, 0x0a, 0x58, 0x07,  //
                     0xaa, 0x01, 0x07, 0x08, 0x94, 0x0a, 0x58, 0x07, 0x60, 0x01});
  CategoryPage page("LTE EUTRA Neighbor Info", store, console);
  const auto snapshot = takeSnapshot(page);
  ASSERT_EQ(snapshot.sections.size(), 3u);
  for (std::size_t index = 0; index < 3; ++index) {
    EXPECT_EQ(snapshot.sections[index].title, "EUTRA Neighbor " + std::to_string(index));
    EXPECT_EQ(snapshot.sections[index].rows.size(), index + 1);
    EXPECT_EQ(snapshot.sections[index].rows[0].text, "earfcn");
    EXPECT_EQ(snapshot.sections[index].rows[0].detail, "1300");
  }
  EXPECT_EQ(snapshot.sections[2].rows[2].detail, "TDD");
}

TEST_F(CategoryPages, UmtsServingCellMeasHasOneSectionPerEntryAndEveryRowReadsComeBackLater) {
  // Two rx_info: rssi -1; rssi -1 and snr 1.
  receive(0x3CD102, {0x1a, 0x02, 0x08, 0x01, 0x1a, 0x04, 0x08, 0x01, 0x20, 0x02});
  CategoryPage page("UMTS Serving Cell Meas", store, console);
  const auto snapshot = takeSnapshot(page);
  ASSERT_EQ(snapshot.sections.size(), 2u);
  for (std::size_t index = 0; index < 2; ++index) {
    EXPECT_EQ(snapshot.sections[index].title, "RxInfo " + std::to_string(index));
    EXPECT_EQ(snapshot.sections[index].rows.size(), index + 1);
    for (const auto& row : snapshot.sections[index].rows) {
      EXPECT_EQ(row.text, "Come back later");
      EXPECT_EQ(row.detail, "Come back later");
    }
  }
}

TEST_F(CategoryPages, TheHeaderIsThePrefixAndTheSectionsNumberCountedFromZero) {
  const std::vector<std::pair<std::string, std::string>> prefixes = {
      {"LTE EUTRA Neighbor Info", "EUTRA Neighbor 12"},
      {"UMTS EUTRA Neighbor Info", "EUTRA Neighbor 12"},
      {"LTE Tx Power", "TxPowerInfo 12"},
      {"UMTS Tx Power", "TxPowerInfo 12"},
      {"LTE UMTS Neighbor Cell Meas", "UMTS Neighbor 12"},
      {"UMTS UMTS Neighbor Cell Meas", "UMTS Neighbor 12"},
      {"GSM UMTS Neighbor Cell Meas", "UMTS Neighbor 12"},
      {"UMTS UTRA Neighbor Info", "UTRA Neighbor 12"},
      {"LTE GSM Neighbor Cell Meas", "GSM Neighbor 12"},
      {"UMTS GSM Neighbor Cell Meas", "GSM Neighbor 12"},
      {"GSM GSM Neighbor Cell Meas", "GSM Neighbor 12"},
      {"UMTS GSM Neighbor Info", "GSM Neighbor 12"},
      {"LTE LTE Neighbor Cell Meas", "LTE Neighbor 12"},
      {"UMTS LTE Neighbor Cell Meas", "LTE Neighbor 12"},
      {"GSM LTE Neighbor Cell Meas", "LTE Neighbor 12"},
      {"LTE CA Status", "Component Carrier 12"},
      {"LTE Active Bearers", "PDP 12"},
      {"UMTS Active Bearers", "PDP 12"},
      {"GSM Active Bearers", "PDP 12"},
      {"UMTS Serving Cell Meas", "RxInfo 12"},
      {"Device Info SIM Files", "SIM Content 12"},
  };
  std::set<std::string> headed;
  for (const auto& [key, title] : prefixes) {
    headed.insert(key);
    EXPECT_EQ(CategoryPage(key, store, console).titleForHeaderInSection(12), title) << key;
  }
  for (const auto& [key, expected] : shownByAnEmptyStore) {
    if (headed.contains(key)) continue;
    EXPECT_EQ(CategoryPage(key, store, console).titleForHeaderInSection(12), std::nullopt) << key;
  }
}

TEST_F(CategoryPages, ASectionPastTheEndOfAListStopsTheProgram) {
  CategoryPage page("LTE Tx Power", store, console);
  ListCell cell;
  EXPECT_EQ(stopReason([&] { page.numberOfRowsInSection(1); }), "entry 1 asked of LTE Tx Power, which has 1");
  EXPECT_EQ(stopReason([&] { page.cellForRowAtIndexPath(1, 0, cell); }), "entry 1 asked of LTE Tx Power, which has 1");
}

TEST_F(CategoryPages, ARowPastTheEndOfItsFieldsStopsTheProgram) {
  ListCell cell;
  EXPECT_EQ(stopReason([&] { CategoryPage("LTE Tx Power", store, console).cellForRowAtIndexPath(0, 1, cell); }),
            "row 1 asked of LTE Tx Power, which has 1");
  EXPECT_EQ(
      stopReason([&] { CategoryPage("LTE Sel Resel Parameters", store, console).cellForRowAtIndexPath(0, 20, cell); }),
      "row 20 asked of LTE Sel Resel Parameters, which has 20");
  store.filled[DisplayDictionary::myLTERRCStateDict] = twoFields("field");
  EXPECT_EQ(stopReason([&] { CategoryPage("LTE RRC State", store, console).cellForRowAtIndexPath(0, 2, cell); }),
            "row 2 asked of LTE RRC State, which has 2");
}

TEST_F(CategoryPages, APageThatFallsBackHasAnAnswerForEveryRow) {
  ListCell cell;
  CategoryPage("Device Info IMSI", store, console).cellForRowAtIndexPath(7, 9, cell);
  EXPECT_EQ(cell, (ListCell{"SecondClickView", "Come back later", "Come back later"}));
}

TEST_F(CategoryPages, AnAbsentDictionaryLeavesTheCellAsItCame) {
  ListCell cell{"", "left", "alone"};
  CategoryPage("GSM Idle Config", store, console).cellForRowAtIndexPath(0, 0, cell);
  EXPECT_EQ(cell, (ListCell{"SecondClickView", "left", "alone"}));
}

TEST_F(CategoryPages, ValuesAreShownInTheirOneTextForm) {
  store.filled[DisplayDictionary::myLTERRCStateDict] = Dictionary{
      {"text", Value::text("two \"lines\"\nof text")},
      {"float", Value(1.4f)},
      {"double", Value(10.0)},
      {"bool", Value(true)},
      {"list", Value(List{Value(std::int32_t{1}), Value::text("a")})},
      {"empty", Value(List{})},
  };
  EXPECT_EQ(shown("LTE RRC State"),
            "- (text=two \"lines\"\nof text; float=1.4; double=10.0; bool=1; list=[1, \"a\"]; empty=[])");
}

TEST_F(CategoryPages, WithoutTechnologyOrCategoryEveryQuestionStopsTheProgram) {
  const auto stopsAtEveryQuestion = [](SecondLevelViewController& page) {
    ListCell cell;
    EXPECT_TRUE(stopReason([&] { page.numberOfSectionsInTableView(); }));
    EXPECT_TRUE(stopReason([&] { page.titleForHeaderInSection(0); }));
    EXPECT_TRUE(stopReason([&] { page.numberOfRowsInSection(0); }));
    EXPECT_TRUE(stopReason([&] { page.cellForRowAtIndexPath(0, 0, cell); }));
  };
  SecondLevelViewController page(environment);
  stopsAtEveryQuestion(page);
  page.firstSelection = "LTE";
  stopsAtEveryQuestion(page);
  page.firstSelection = std::nullopt;
  page.seguedThroughRow = "Tx Power";
  stopsAtEveryQuestion(page);
  page.firstSelection = "LTE";
  EXPECT_EQ(outline(takeSnapshot(page)), "TxPowerInfo 0 (" + waiting + ")");
}

TEST_F(CategoryPages, ThePageIsMadeOnceWhenTheFirstQuestionComes) {
  SecondLevelViewController page(environment);
  page.firstSelection = "LTE";
  page.seguedThroughRow = "Tx Power";
  const std::string first = outline(takeSnapshot(page));
  // Nobody changes a selection that is shown; a page that were made anew for each question would show another here.
  page.seguedThroughRow = "RRC State";
  EXPECT_EQ(outline(takeSnapshot(page)), first);
}

TEST_F(CategoryPages, RowsAreAsHighAsTheirContentNeeds) {
  const SecondLevelViewController page(environment);
  EXPECT_EQ(page.heightForRowAtIndexPath(0, 0), automaticDimension);
  EXPECT_EQ(page.estimatedHeightForRowAtIndexPath(0, 0), automaticDimension);
}

}  // namespace
}  // namespace probeview
