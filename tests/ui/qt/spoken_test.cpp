// SPDX-License-Identifier: Apache-2.0
//
// What a screen reader finds in the window.
#include <QAccessible>

#include "tests/ui/qt/window_testing.h"

namespace probeview {
namespace {

struct Spoken {
  QAccessible::Role role;
  std::string name;
  QAccessibleInterface* interface;
};

class WindowSpoken : public testing_ui::WindowTest {
 protected:
  void SetUp() override { QAccessible::setActive(true); }

  // Everything that a screen reader comes across, in its order.
  std::vector<Spoken> everything() {
    std::vector<Spoken> found;
    collect(QAccessible::queryAccessibleInterface(&window()), found);
    return found;
  }
  std::vector<std::string> names(QAccessible::Role role) {
    std::vector<std::string> found;
    for (const auto& spoken : everything()) {
      if (spoken.role == role) found.push_back(spoken.name);
    }
    return found;
  }

 private:
  static void collect(QAccessibleInterface* interface, std::vector<Spoken>& found) {
    if (!interface || interface->state().invisible) return;
    found.push_back({interface->role(), interface->text(QAccessible::Name).toStdString(), interface});
    for (int child = 0; child < interface->childCount(); ++child) collect(interface->child(child), found);
  }
};

TEST_F(WindowSpoken, EachRowIsReadOutAsLabelAndValue) {
  Dictionary state;
  state.set("state", Value::text("KLTE_RRC_CONN_STATE_CONNECTED"));
  state.set("duration", Value(std::uint32_t{17}));
  store.filled[DisplayDictionary::myLTERRCStateDict] = state;
  show();
  goTo("LTE", "RRC State");
  const std::vector<std::string> expected{"state, KLTE_RRC_CONN_STATE_CONNECTED", "duration, 17"};
  EXPECT_EQ(names(QAccessible::ListItem), expected);
}

TEST_F(WindowSpoken, ARowWithoutValueIsReadOutAsItsLabel) {
  show();
  const std::vector<std::string> expected{"Device Info", "LTE", "UMTS", "GSM"};
  EXPECT_EQ(names(QAccessible::ListItem), expected);
  EXPECT_EQ(names(QAccessible::List), std::vector<std::string>{stack->topPage().title()});
}

TEST_F(WindowSpoken, TheNameFollowsAReload) {
  Dictionary state;
  state.set("state", Value::text("IDLE"));
  store.filled[DisplayDictionary::myLTERRCStateDict] = state;
  show();
  goTo("LTE", "RRC State");
  state.set("state", Value::text("CONNECTED"));
  store.filled[DisplayDictionary::myLTERRCStateDict] = state;
  loop.advance(std::chrono::seconds(5));
  EXPECT_EQ(names(QAccessible::ListItem), std::vector<std::string>{"state, CONNECTED"});
}

TEST_F(WindowSpoken, TitleBackButtonHeadersAndStatusAreThere) {
  auto page = std::make_unique<testing_ui::HandPage>();
  page->name = "Three cells";
  page->content.sections = {{"EUTRA Neighbor 0", {testing_ui::valueRow("earfcn", "1300")}}, {"EUTRA Neighbor 1", {}}};
  showPage(std::move(page));
  const std::vector<std::string> headings{"Three cells", "EUTRA Neighbor 0", "EUTRA Neighbor 1"};
  auto found = names(QAccessible::Heading);
  std::sort(found.begin(), found.end(), [](const auto& left, const auto& right) { return left.back() < right.back(); });
  EXPECT_EQ(found.size(), headings.size());
  for (const auto& heading : headings) {
    EXPECT_NE(std::find(found.begin(), found.end(), heading), found.end()) << heading;
  }
  EXPECT_EQ(names(QAccessible::ListItem), std::vector<std::string>{"earfcn, 1300"}) << "no row that is not shown";
  const auto texts = names(QAccessible::StaticText);
  EXPECT_NE(std::find(texts.begin(), texts.end(), statusText), texts.end());
  EXPECT_TRUE(names(QAccessible::Button).empty()) << "no way back from the first page";
}

TEST_F(WindowSpoken, AScreenReaderCanOpenARowAndGoBack) {
  show();
  const auto pressOn = [this](QAccessible::Role role, const std::string& name) {
    for (const auto& spoken : everything()) {
      if (spoken.role != role || spoken.name != name) continue;
      auto* actions = spoken.interface->actionInterface();
      ASSERT_NE(actions, nullptr);
      actions->doAction(QAccessibleActionInterface::pressAction());
      rest();
      return;
    }
    ADD_FAILURE() << "nothing is called " << name;
  };
  pressOn(QAccessible::ListItem, "UMTS");
  EXPECT_EQ(title(), "UMTS");
  pressOn(QAccessible::Button, "Back");
  EXPECT_EQ(stack->depth(), 1u);
}

TEST_F(WindowSpoken, TheMarkedRowIsTheFocusedOne) {
  show();
  press(Qt::Key_Down);
  press(Qt::Key_Down);
  rest();
  for (const auto& spoken : everything()) {
    if (spoken.role != QAccessible::ListItem) continue;
    EXPECT_EQ(spoken.interface->state().focused, spoken.name == "LTE") << spoken.name;
    EXPECT_EQ(spoken.interface->state().selected, spoken.name == "LTE") << spoken.name;
  }
}

}  // namespace
}  // namespace probeview
