// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

#include "ui/list_content.h"
#include "values/line_sink.h"

namespace probeview {

class MetricValidator;
struct CategoryPageRule;

// What the category page of a key shows: a pure function of the store. The key is a technology and a category joined by
// one blank ("LTE Tx Power"); a key that nothing is known about has one section with one row that reads "Come back
// later" twice. The only thing that it does beside answering is to complain on the console log (see the rules).
class CategoryPage final : public ListContent {
 public:
  CategoryPage(std::string key, const MetricValidator& metricValidator, LineSink& consoleLog);

  std::size_t numberOfSectionsInTableView() override;
  std::optional<std::string> titleForHeaderInSection(std::size_t section) override;
  std::size_t numberOfRowsInSection(std::size_t section) override;
  void cellForRowAtIndexPath(std::size_t section, std::size_t row, ListCell& cell) override;

 private:
  const std::string key_;
  const CategoryPageRule& rule_;
  const MetricValidator& metricValidator_;
  LineSink& consoleLog_;
};

}  // namespace probeview
