// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>

#include "ui/category_page.h"
#include "ui/list_page.h"
#include "ui/page_environment.h"
#include "ui/varnet_view_items.h"

namespace probeview {

// The page that shows values: one category of one technology, reloaded every five seconds so that what the store has
// received since shows without a hand being moved. What its list shows is decided in ui/category_page.h.
class SecondLevelViewController final : public ListPage {
 public:
  static constexpr std::string_view cellIdentifier = "SecondClickView";
  static constexpr std::chrono::nanoseconds reloadInterval = std::chrono::seconds(5);

  explicit SecondLevelViewController(const PageEnvironment& environment = {});

  VarnetViewItems tableViewFields;
  // The technology and the category; set before the page is shown, never changed. While either is absent each question
  // of the list stops the program.
  std::optional<std::string> firstSelection;
  std::optional<std::string> seguedThroughRow;
  // Kept beside the selection; nothing sets it.
  ListCell* currentCell = nullptr;
  const MetricValidator& myMetricValidator;

  std::string title() const override;
  std::optional<PageFeed> feed() const override;
  std::size_t numberOfSectionsInTableView() override;
  std::optional<std::string> titleForHeaderInSection(std::size_t section) override;
  std::size_t numberOfRowsInSection(std::size_t section) override;
  void cellForRowAtIndexPath(std::size_t section, std::size_t row, ListCell& cell) override;
  double heightForRowAtIndexPath(std::size_t section, std::size_t row) const override;
  double estimatedHeightForRowAtIndexPath(std::size_t section, std::size_t row) const override;

  // Starts the timer. It ends with the page, and nothing else stops it: a covered page goes on reloading.
  void viewDidLoad() override;
  // Posts a reload of the whole list to the main queue.
  void update();

 private:
  std::string key() const;
  // Made when the first question comes, as the selection is set by then.
  CategoryPage& page();

  std::optional<CategoryPage> page_;
  TaskQueue& mainQueue_;
  Scheduler& scheduler_;
  LineSink& consoleLog_;
  ScheduledTaskHandle timer_;
};

}  // namespace probeview
