// SPDX-License-Identifier: Apache-2.0
#include "ui/snapshot_difference.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <random>

namespace probeview {
namespace {

using Kind = SnapshotEdit::Kind;
using Edits = std::vector<SnapshotEdit>;

ListCell row(const std::string& label, const std::string& value = "") { return {"SecondClickView", label, value}; }

PageSnapshot page(std::vector<std::vector<ListCell>> sections) {
  PageSnapshot snapshot;
  for (auto& rows : sections) {
    snapshot.sections.push_back({"Section " + std::to_string(snapshot.sections.size()), std::move(rows)});
  }
  return snapshot;
}

PageSnapshot applied(PageSnapshot shown, const Edits& edits, const PageSnapshot& after) {
  for (const auto& edit : edits) applyEdit(shown, edit, after);
  return shown;
}

TEST(SnapshotDifference, EqualPagesDoNotDiffer) {
  const auto before = page({{row("a", "1"), row("b", "2")}, {}});
  EXPECT_EQ(snapshotDifference(before, before), Edits{});
}

TEST(SnapshotDifference, AValueThatChangesIsAChangeAndNothingElse) {
  EXPECT_EQ(snapshotDifference(page({{row("a", "1"), row("b", "2"), row("c", "3")}}),
                               page({{row("a", "1"), row("b", "7"), row("c", "8")}})),
            (Edits{{Kind::ChangeRows, 0, 1, 2}}));
}

TEST(SnapshotDifference, AFieldThatComesIsInsertedAtItsPlace) {
  EXPECT_EQ(snapshotDifference(page({{row("a"), row("c")}}), page({{row("a"), row("b"), row("c"), row("d")}})),
            (Edits{{Kind::InsertRows, 0, 1, 1}, {Kind::InsertRows, 0, 3, 1}}));
}

TEST(SnapshotDifference, AFieldThatGoesIsRemovedFromItsPlace) {
  EXPECT_EQ(snapshotDifference(page({{row("a"), row("b"), row("c"), row("d")}}), page({{row("b"), row("d")}})),
            (Edits{{Kind::RemoveRows, 0, 2, 1}, {Kind::RemoveRows, 0, 0, 1}}));
}

TEST(SnapshotDifference, RowsThatReadAlikeAreToldApartByTheirTurn) {
  EXPECT_EQ(snapshotDifference(page({{row("Come back later", "1"), row("Come back later", "2")}}),
                               page({{row("Come back later", "1"), row("Come back later", "3")}})),
            (Edits{{Kind::ChangeRows, 0, 1, 1}}));
}

TEST(SnapshotDifference, SectionsComeAndGoAtTheEnd) {
  const auto two = page({{row("a")}, {row("a")}});
  const auto four = page({{row("a")}, {row("a")}, {row("a")}, {row("b")}});
  EXPECT_EQ(snapshotDifference(two, four), (Edits{{Kind::InsertSections, 2, 0, 2}}));
  EXPECT_EQ(snapshotDifference(four, two), (Edits{{Kind::RemoveSections, 2, 0, 2}}));
}

TEST(SnapshotDifference, ATitleThatChangesLeavesTheRowsAlone) {
  auto before = page({{row("a")}});
  auto after = before;
  after.sections[0].title = std::nullopt;
  EXPECT_EQ(snapshotDifference(before, after), (Edits{{Kind::ChangeTitle, 0, 0, 0}}));
}

// Fields of a dictionary never change their order from one message to the next; should they, the fewest rows move.
TEST(SnapshotDifference, OnlyTheRowsThatLeaveTheirOrderMove) {
  EXPECT_EQ(snapshotDifference(page({{row("a"), row("b"), row("c"), row("d")}}),
                               page({{row("b"), row("c"), row("d"), row("a")}})),
            (Edits{{Kind::RemoveRows, 0, 0, 1}, {Kind::InsertRows, 0, 3, 1}}));
}

class RandomPages : public testing::TestWithParam<unsigned> {
 protected:
  std::size_t upTo(std::size_t most) { return std::uniform_int_distribution<std::size_t>(0, most)(random_); }

  PageSnapshot randomPage() {
    PageSnapshot snapshot;
    snapshot.sections.resize(upTo(4));
    for (auto& section : snapshot.sections) {
      if (upTo(2) != 0) section.title = std::to_string(upTo(2));
      section.rows.resize(upTo(8));
      for (auto& cell : section.rows) {
        if (upTo(9) != 0) cell.text = std::string(1, static_cast<char>('a' + upTo(7)));
        if (upTo(9) != 0) cell.detail = std::to_string(upTo(2));
      }
    }
    return snapshot;
  }

  std::mt19937 random_{GetParam()};
};

TEST_P(RandomPages, ApplyingTheDifferenceGivesTheAfterPage) {
  for (int turn = 0; turn < 500; ++turn) {
    const auto before = randomPage();
    const auto after = randomPage();
    ASSERT_EQ(applied(before, snapshotDifference(before, after), after), after);
  }
}

TEST_P(RandomPages, FieldsThatComeAndGoNeverRemoveAFieldThatStays) {
  for (int turn = 0; turn < 500; ++turn) {
    const auto sample = [&] {
      std::vector<ListCell> rows;
      for (char name = 'a'; name <= 'z'; ++name) {
        if (upTo(1) != 0) rows.push_back(row(std::string(1, name), std::to_string(upTo(1))));
      }
      return page({rows});
    };
    const auto before = sample();
    const auto after = sample();
    const auto edits = snapshotDifference(before, after);
    ASSERT_EQ(applied(before, edits, after), after);
    for (const auto& edit : edits) {
      if (edit.kind != Kind::RemoveRows) continue;
      // Removals come first and from the end, so that their indexes are those of the page before.
      for (std::size_t index = edit.first; index < edit.first + edit.count; ++index) {
        const auto& label = before.sections[0].rows[index].text;
        const auto& rows = after.sections[0].rows;
        ASSERT_TRUE(std::none_of(rows.begin(), rows.end(), [&](const ListCell& cell) { return cell.text == label; }));
      }
    }
  }
}

TEST_P(RandomPages, ARowIsFollowedToWhereItsLabelIsOrIsGone) {
  for (int turn = 0; turn < 500; ++turn) {
    auto before = randomPage();
    const auto after = randomPage();
    auto shown = before;
    const auto edits = snapshotDifference(before, after);
    // Marks each row of the page before, follows the marks through the edits by hand, and compares.
    for (std::size_t section = 0; section < shown.sections.size(); ++section) {
      for (std::size_t index = 0; index < shown.sections[section].rows.size(); ++index) {
        auto marked = before;
        marked.sections[section].rows[index].identifier = "marked";
        std::optional<RowPlace> expected;
        for (const auto& edit : edits) {
          if (edit.kind != Kind::ChangeRows) applyEdit(marked, edit, after);
        }
        for (std::size_t at = 0; at < marked.sections.size(); ++at) {
          for (std::size_t place = 0; place < marked.sections[at].rows.size(); ++place) {
            if (marked.sections[at].rows[place].identifier == "marked") expected = {at, place};
          }
        }
        ASSERT_EQ(followRow({section, index}, edits), expected);
      }
    }
  }
}

INSTANTIATE_TEST_SUITE_P(Seeds, RandomPages, testing::Range(1u, 5u));

}  // namespace
}  // namespace probeview
