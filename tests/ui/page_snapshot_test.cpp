// SPDX-License-Identifier: Apache-2.0
#include "ui/page_snapshot.h"

#include <gtest/gtest.h>

namespace probeview {
namespace {

// Writes down what it is asked.
class RecordingContent final : public ListContent {
 public:
  std::vector<std::string> asked;
  std::vector<std::size_t> rows{2, 0, 1};

  std::size_t numberOfSectionsInTableView() override {
    asked.push_back("sections");
    return rows.size();
  }
  std::optional<std::string> titleForHeaderInSection(std::size_t section) override {
    asked.push_back("title " + std::to_string(section));
    if (section == 1) return std::nullopt;
    return "Section " + std::to_string(section);
  }
  std::size_t numberOfRowsInSection(std::size_t section) override {
    asked.push_back("rows " + std::to_string(section));
    return rows[section];
  }
  void cellForRowAtIndexPath(std::size_t section, std::size_t row, ListCell& cell) override {
    asked.push_back("cell " + std::to_string(section) + " " + std::to_string(row));
    EXPECT_EQ(cell, ListCell{});
    cell.identifier = "Cell";
    if (row == 0) cell.text = "label " + std::to_string(section);
  }
};

TEST(PageSnapshot, ASnapshotAsksEachQuestionExactlyOnce) {
  RecordingContent content;
  const auto snapshot = takeSnapshot(content);
  EXPECT_EQ(content.asked, (std::vector<std::string>{"sections", "title 0", "rows 0", "cell 0 0", "cell 0 1", "title 1",
                                                     "rows 1", "title 2", "rows 2", "cell 2 0"}));
  ASSERT_EQ(snapshot.sections.size(), 3u);
  EXPECT_EQ(snapshot.sections[0].title, "Section 0");
  EXPECT_EQ(snapshot.sections[1].title, std::nullopt);
  EXPECT_EQ(snapshot.sections[1].rows.size(), 0u);
  EXPECT_EQ(snapshot.sections[2].rows[0].text, "label 2");
  EXPECT_EQ(snapshot.rowCount(), 3u);
}

TEST(PageSnapshot, ACellThatThePageLeavesAloneIsBlank) {
  RecordingContent content;
  const auto snapshot = takeSnapshot(content);
  EXPECT_EQ(snapshot.sections[0].rows[1].text, std::nullopt);
  EXPECT_EQ(snapshot.sections[0].rows[1].detail, std::nullopt);
}

TEST(PageSnapshot, ARowIsReadOutAsLabelAndValue) {
  EXPECT_EQ(accessibleLabel({"c", "dl_bw", "20"}), "dl_bw, 20");
  EXPECT_EQ(accessibleLabel({"c", "LTE", std::nullopt}), "LTE");
  EXPECT_EQ(accessibleLabel({"c", std::nullopt, "20"}), "20");
  EXPECT_EQ(accessibleLabel({"c", std::nullopt, std::nullopt}), "");
  EXPECT_EQ(accessibleLabel({"c", "multi_band_info", ""}), "multi_band_info, ");
}

TEST(PageSnapshot, PlainTextAlignsValuesAndIndentsTheLinesOfALongValue) {
  PageSnapshot snapshot;
  snapshot.sections.push_back({"PDP 0", {{"c", "id", "5"}, {"c", "address", "one\ntwo"}, {"c", {}, {}}}});
  snapshot.sections.push_back({std::nullopt, {{"c", "état", "frei"}, {"c", "alone", {}}}});
  EXPECT_EQ(plainText(snapshot),
            "PDP 0\n"
            "  id       5\n"
            "  address  one\\ntwo\n"
            "\n"
            "  état     frei\n"
            "  alone\n");
}

}  // namespace
}  // namespace probeview
