// SPDX-License-Identifier: Apache-2.0
#include "ui/second_level_view_controller.h"

#include "platform/fatal_error.h"
#include "ui/category_page_rules.h"

namespace probeview {

SecondLevelViewController::SecondLevelViewController(const PageEnvironment& environment)
    : myMetricValidator(environment.metricValidator),
      mainQueue_(environment.mainQueue),
      scheduler_(environment.scheduler),
      consoleLog_(environment.consoleLog) {}

std::string SecondLevelViewController::title() const { return seguedThroughRow.value_or(""); }

std::optional<PageFeed> SecondLevelViewController::feed() const { return feedOf(categoryPageRule(key())); }

std::size_t SecondLevelViewController::numberOfSectionsInTableView() { return page().numberOfSectionsInTableView(); }

std::optional<std::string> SecondLevelViewController::titleForHeaderInSection(std::size_t section) {
  return page().titleForHeaderInSection(section);
}

std::size_t SecondLevelViewController::numberOfRowsInSection(std::size_t section) {
  return page().numberOfRowsInSection(section);
}

void SecondLevelViewController::cellForRowAtIndexPath(std::size_t section, std::size_t row, ListCell& cell) {
  page().cellForRowAtIndexPath(section, row, cell);
}

double SecondLevelViewController::heightForRowAtIndexPath(std::size_t, std::size_t) const { return automaticDimension; }

double SecondLevelViewController::estimatedHeightForRowAtIndexPath(std::size_t, std::size_t) const {
  return automaticDimension;
}

void SecondLevelViewController::viewDidLoad() {
  ListPage::viewDidLoad();
  timer_ = scheduler_.every(reloadInterval, [this] { update(); });
}

void SecondLevelViewController::update() { mainQueue_.post(reloadTask()); }

CategoryPage& SecondLevelViewController::page() {
  if (!page_) page_.emplace(key(), myMetricValidator, consoleLog_);
  return *page_;
}

std::string SecondLevelViewController::key() const {
  if (!firstSelection || !seguedThroughRow) {
    fatalError("a category page was asked for its rows before it was told its technology and category");
  }
  return pageKey(*firstSelection, *seguedThroughRow);
}

}  // namespace probeview
