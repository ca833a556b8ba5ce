// SPDX-License-Identifier: Apache-2.0
//
// The one table of the category pages: from a page's key to the answers of its list.
#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string_view>
#include <variant>

#include "store/metric_validator.h"
#include "ui/list_page.h"
#include "values/dictionary.h"

namespace probeview {

struct NoSource {};
// A display dictionary; absent until the first metric of its kind.
using DictionarySource = const std::optional<Dictionary>& (*)(const MetricValidator& store);
// A list of entries of a record, each a dictionary from field name to value.
using EntryListSource = const List& (*)(const MetricValidator& store);
// A single entry of a record.
using EntrySource = const Dictionary& (*)(const MetricValidator& store);

using PageSource = std::variant<NoSource, DictionarySource, EntryListSource, EntrySource>;

enum class SectionRule : std::uint8_t {
  One,
  OnePerEntry,  // of the entry list
};

enum class RowRule : std::uint8_t {
  One,
  OnePerField,               // of the dictionary (none while it is absent) or of the section's entry
  OnePerFieldElseComplaint,  // the same, but an absent dictionary has one row and a line on the console log
};

enum class CellRule : std::uint8_t {
  Field,          // field and value; a cell of an absent dictionary is left as it comes
  ComeBackLater,  // the fallback
};

struct CategoryPageRule {
  std::string_view key;
  PageSource source;
  // The metrics that the page's content changes with, by the display dictionaries that hold their latest messages.
  std::span<const DisplayDictionary> fedBy;
  SectionRule sections;
  std::string_view titlePrefix;  // a header is this and the section's number; empty: no header
  RowRule rows;
  CellRule cells;
};

// Exact and case-sensitive. A key that has no rule of its own gets the fallback: one section, no header, one row,
// "Come back later".
const CategoryPageRule& categoryPageRule(std::string_view key);

PageFeed feedOf(const CategoryPageRule& rule);

}  // namespace probeview
