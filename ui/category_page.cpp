// SPDX-License-Identifier: Apache-2.0
#include "ui/category_page.h"

#include <utility>

#include "platform/fatal_error.h"
#include "ui/category_page_rules.h"
#include "ui/list_index.h"
#include "ui/second_level_view_controller.h"
#include "values/printer.h"

namespace probeview {

namespace {

template <typename... Visitors>
struct Overloaded : Visitors... {
  using Visitors::operator()...;
};
// clang 14 does not deduce the arguments of an aggregate by itself.
template <typename... Visitors>
Overloaded(Visitors...) -> Overloaded<Visitors...>;

const Dictionary& entryOf(const List& entries, std::size_t section, std::string_view key) {
  requireIndex("entry", section, entries.size(), key);
  const auto* entry = entries[section].dictionary();
  if (entry == nullptr) fatalError("entry " + std::to_string(section) + " of " + std::string(key) + " has no fields");
  return *entry;
}

// The fields that a section shows; null for an absent dictionary and for a page without a source.
const Dictionary* fieldsOf(const CategoryPageRule& rule, const MetricValidator& store, std::size_t section) {
  return std::visit(
      Overloaded{
          [](NoSource) -> const Dictionary* { return nullptr; },
          [&](DictionarySource source) -> const Dictionary* {
            const auto& dictionary = source(store);
            return dictionary ? &*dictionary : nullptr;
          },
          [&](EntryListSource source) -> const Dictionary* { return &entryOf(source(store), section, rule.key); },
          [&](EntrySource source) -> const Dictionary* { return &source(store); },
      },
      rule.source);
}

}  // namespace

CategoryPage::CategoryPage(std::string key, const MetricValidator& metricValidator, LineSink& consoleLog)
    : key_(std::move(key)), rule_(categoryPageRule(key_)), metricValidator_(metricValidator), consoleLog_(consoleLog) {}

std::size_t CategoryPage::numberOfSectionsInTableView() {
  if (rule_.sections == SectionRule::One) return 1;
  return std::get<EntryListSource>(rule_.source)(metricValidator_).size();
}

std::optional<std::string> CategoryPage::titleForHeaderInSection(std::size_t section) {
  if (rule_.titlePrefix.empty()) return std::nullopt;
  return std::string(rule_.titlePrefix) + std::to_string(section);
}

std::size_t CategoryPage::numberOfRowsInSection(std::size_t section) {
  if (rule_.rows == RowRule::One) return 1;
  if (const Dictionary* fields = fieldsOf(rule_, metricValidator_, section)) return fields->size();
  if (rule_.rows == RowRule::OnePerField) return 0;
  consoleLog_.line("You are screwed");
  return 1;
}

void CategoryPage::cellForRowAtIndexPath(std::size_t section, std::size_t row, ListCell& cell) {
  cell.identifier = SecondLevelViewController::cellIdentifier;
  if (rule_.cells == CellRule::ComeBackLater) {
    cell.text = "Come back later";
    cell.detail = "Come back later";
    return;
  }
  const Dictionary* fields = fieldsOf(rule_, metricValidator_, section);
  if (fields == nullptr) return;
  requireIndex("row", row, fields->size(), key_);
  const auto& [key, value] = (*fields)[row];
  cell.text = std::string(key.text());
  cell.detail = bareText(value);
}

}  // namespace probeview
