// SPDX-License-Identifier: Apache-2.0
#include "ui/qt/page_model.h"

#include <QAbstractItemModelTester>
#include <QPersistentModelIndex>
#include <random>

#include "tests/ui/qt/window_testing.h"

namespace probeview {
namespace {

using testing_ui::HandPage;
using testing_ui::sectionOfRows;
using testing_ui::valueRow;

// What a list view makes of the model: it only hears what changed, and asks for that.
class Follower {
 public:
  explicit Follower(const qt::PageModel& model) : model_(model) {
    for (int row = 0; row < model.rowCount(); ++row) rows_.push_back(read(row));
    QObject::connect(&model, &QAbstractItemModel::rowsInserted, &context_,
                     [this](const QModelIndex&, int first, int last) {
                       for (int row = first; row <= last; ++row) rows_.insert(rows_.begin() + row, read(row));
                     });
    QObject::connect(&model, &QAbstractItemModel::rowsRemoved, &context_,
                     [this](const QModelIndex&, int first, int last) {
                       rows_.erase(rows_.begin() + first, rows_.begin() + last + 1);
                     });
    QObject::connect(&model, &QAbstractItemModel::dataChanged, &context_,
                     [this](const QModelIndex& first, const QModelIndex& last) {
                       for (int row = first.row(); row <= last.row(); ++row) {
                         rows_[static_cast<std::size_t>(row)] = read(row);
                       }
                     });
    QObject::connect(&model, &QAbstractItemModel::modelReset, &context_,
                     [] { ADD_FAILURE() << "a reset loses place"; });
  }

  // One line per row: section's number, label, value; "-" for a row that is not shown.
  const std::vector<std::string>& rows() const { return rows_; }

  static std::vector<std::string> expected(const PageSnapshot& snapshot) {
    std::vector<std::string> rows;
    for (std::size_t section = 0; section < snapshot.sections.size(); ++section) {
      const std::string number = std::to_string(section) + " ";
      const auto& cells = snapshot.sections[section].rows;
      if (cells.empty()) rows.push_back(number + "-");
      for (const auto& cell : cells) rows.push_back(number + cell.text.value_or("") + " = " + cell.detail.value_or(""));
    }
    return rows;
  }

 private:
  std::string read(int row) const {
    const auto at = [&](qt::PageModel::Role role) { return model_.data(model_.index(row), role); };
    const std::string number = at(qt::PageModel::SectionRole).toString().toStdString() + " ";
    if (!at(qt::PageModel::IsShownRole).toBool()) return number + "-";
    return number + at(qt::PageModel::LabelRole).toString().toStdString() + " = " +
           at(qt::PageModel::ValueRole).toString().toStdString();
  }

  const qt::PageModel& model_;
  QObject context_;
  std::vector<std::string> rows_;
};

TEST(PageModelTest, SectionsStandOneAfterTheOther) {
  HandPage page;
  page.content.sections = {sectionOfRows(2), sectionOfRows(0), sectionOfRows(1)};
  page.content.sections[1].title = "empty";
  const qt::PageModel model(page);
  EXPECT_EQ(Follower(model).rows(), Follower::expected(page.content));
  EXPECT_EQ(model.rowCount(), 4);
  EXPECT_EQ(model.sectionTitle(1), QStringLiteral("empty"));
  EXPECT_EQ(model.sectionTitle(0), QString());
  EXPECT_EQ(model.sectionTitle(3), QString());
  EXPECT_EQ(model.sectionTitle(-1), QString());
}

TEST(PageModelTest, APageWithoutSectionsHasNoRows) {
  HandPage page;
  qt::PageModel model(page);
  EXPECT_EQ(model.rowCount(), 0);
  page.content.sections = {sectionOfRows(3)};
  page.reload();
  EXPECT_EQ(model.rowCount(), 3);
  page.content.sections.clear();
  page.reload();
  EXPECT_EQ(model.rowCount(), 0);
}

TEST(PageModelTest, AbsentAndEmptyValuesAreToldApart) {
  HandPage page;
  page.content.sections = {{std::nullopt, {ListCell{}, valueRow("label", "")}}};
  const qt::PageModel model(page);
  EXPECT_FALSE(model.data(model.index(0), qt::PageModel::HasValueRole).toBool());
  EXPECT_TRUE(model.data(model.index(1), qt::PageModel::HasValueRole).toBool());
  EXPECT_EQ(model.data(model.index(0), qt::PageModel::SpokenRole).toString(), QString());
}

TEST(PageModelTest, WhoeverOnlyHearsTheChangesSeesWhatThePageShows) {
  const auto seed = std::random_device{}();
  SCOPED_TRACE("seed " + std::to_string(seed));
  std::mt19937 random(seed);
  const auto below = [&](std::size_t limit) {
    return std::uniform_int_distribution<std::size_t>(0, limit - 1)(random);
  };
  const auto anyContent = [&] {
    PageSnapshot content;
    content.sections.resize(below(5));
    for (auto& section : content.sections) {
      if (below(2) == 0) section.title = "title " + std::to_string(below(3));
      for (std::size_t label = 0; label < 8; ++label) {
        if (below(3) == 0) continue;
        section.rows.push_back(valueRow("label " + std::to_string(label), std::to_string(below(2))));
      }
      if (below(6) == 0) section.rows.clear();
      if (below(4) == 0) std::shuffle(section.rows.begin(), section.rows.end(), random);
    }
    return content;
  };
  HandPage page;
  page.content = anyContent();
  qt::PageModel model(page);
  const QAbstractItemModelTester tester(&model, QAbstractItemModelTester::FailureReportingMode::Warning);
  const Follower follower(model);
  for (int round = 0; round < 2000; ++round) {
    page.content = anyContent();
    page.reload();
    ASSERT_EQ(follower.rows(), Follower::expected(page.content)) << "round " << round;
    for (std::size_t section = 0; section < page.content.sections.size(); ++section) {
      ASSERT_EQ(model.sectionTitle(static_cast<int>(section)).toStdString(),
                page.content.sections[section].title.value_or(""));
    }
  }
}

TEST(PageModelTest, ARowThatStaysIsTheSameRowAfterAReload) {
  HandPage page;
  page.content.sections = {sectionOfRows(5), sectionOfRows(5)};
  qt::PageModel model(page);
  const QPersistentModelIndex followed(model.index(7));
  page.content.sections[0].rows.resize(2);
  page.content.sections[1].rows.insert(page.content.sections[1].rows.begin(), valueRow("new", ""));
  page.content.sections[1].rows[3].detail = "changed";
  page.reload();
  ASSERT_TRUE(followed.isValid());
  EXPECT_EQ(model.cell(followed.row())->text, "row 2");
  EXPECT_EQ(model.cell(followed.row())->detail, "changed");
}

TEST(PageModelTest, AnUnchangedReloadSaysNothing) {
  HandPage page;
  page.content.sections = {sectionOfRows(50)};
  qt::PageModel model(page);
  int changes = 0;
  QObject::connect(&model, &QAbstractItemModel::dataChanged, [&] { ++changes; });
  QObject::connect(&model, &QAbstractItemModel::rowsInserted, [&] { ++changes; });
  QObject::connect(&model, &QAbstractItemModel::rowsRemoved, [&] { ++changes; });
  page.reload();
  EXPECT_EQ(changes, 0);
  EXPECT_EQ(page.timesAsked, 2);
}

TEST(PageModelTest, WhileHeldReloadsWaitAndAreMadeUpForByOne) {
  HandPage page;
  page.content.sections = {sectionOfRows(1)};
  qt::PageModel model(page);
  model.setHeld(true);
  page.content.sections = {sectionOfRows(2)};
  page.reload();
  page.reload();
  EXPECT_EQ(page.timesAsked, 1);
  EXPECT_EQ(model.rowCount(), 1);
  model.setHeld(false);
  EXPECT_EQ(page.timesAsked, 2);
  EXPECT_EQ(model.rowCount(), 2);
  model.setHeld(true);
  model.setHeld(false);
  EXPECT_EQ(page.timesAsked, 2) << "nothing waited";
}

TEST(PageModelTest, ADetachedModelKeepsWhatItShowsAndAsksNoMore) {
  auto page = std::make_unique<HandPage>();
  page->content.sections = {sectionOfRows(3)};
  qt::PageModel model(*page);
  model.setHeld(true);
  page->reload();
  model.detach();
  page->reload();
  page.reset();
  model.setHeld(false);
  EXPECT_EQ(model.rowCount(), 3);
  EXPECT_EQ(model.cell(2)->text, "row 2");
}

}  // namespace
}  // namespace probeview
