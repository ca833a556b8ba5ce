// SPDX-License-Identifier: Apache-2.0
#include "service/configuration.h"

#include <algorithm>
#include <utility>

#include "messages/metric_identifiers.h"
#include "values/near_matches.h"
#include "values/plain_text.h"
#include "values/utf8.h"

namespace probeview {
namespace {

// Thrown where the TOML library finds one of its own assertions broken.
struct BrokenAssertion {};

// Version 3.3.0 asserts that a key's first character can begin a key before it looks whether it can: "[%" would stop
// the service. What follows that assertion reports the character as it should, so it is let pass; any other would be
// news to us, and refuses the file.
inline void tomlAssertionBroken(std::string_view expression) {
  if (expression.find("is_bare_key_character") == std::string_view::npos) throw BrokenAssertion{};
}

}  // namespace
}  // namespace probeview

// Assertions must stay assertions: without them the library takes their truth for granted.
#undef NDEBUG
#define TOML_ASSERT(expression) \
  (static_cast<bool>(expression) ? static_cast<void>(0) : ::probeview::tomlAssertionBroken(#expression))
// The library's compiled form throws; its header form, asked so, returns its errors.
#define TOML_HEADER_ONLY 1
#define TOML_EXCEPTIONS 0
#include <toml++/toml.h>

namespace probeview {

namespace {

constexpr std::int64_t longestPeriod = 86'400'000;  // a day, in milliseconds
constexpr std::string_view onChange = "on change";
// Dots nest one table in another, and the library takes tables apart by recursion; no file that is meant has so many.
constexpr std::ptrdiff_t mostDots = 4000;
constexpr std::size_t mostNotes = 100;
constexpr std::string_view sectionNames[] = {"metrics", "triggers"};
// A reason may quote a key of the file, which may be as long as the file.
constexpr std::size_t longestReason = 500;

// What the library is given to read: every character outside ASCII is U+FFFD there. No name of a metric has one, they
// stay harmless in comments, and version 3.3.0 takes a wrong turn at those that its table of blanks does not expect.
std::string withoutForeignCharacters(std::string_view utf8) {
  std::string text;
  text.reserve(utf8.size());
  for (const char character : utf8) {
    const auto byte = static_cast<unsigned char>(character);
    if (byte < 0x80) {
      text += character;
    } else if (byte >= 0xC0) {
      text += "\xEF\xBF\xBD";  // for the first byte of a sequence; the others are left out
    }
  }
  return text;
}

// The number of bytes before the first sequence that is not UTF-8.
std::size_t validPrefix(std::string_view text) {
  std::string valid;
  appendValidUtf8(text, valid);
  const auto same = static_cast<std::size_t>(std::ranges::mismatch(text, valid).in1 - text.begin());
  if (valid == text) return text.size();
  // The faulty sequence may begin like the replacement that took its place.
  const std::string_view before = text.substr(0, same);
  return same - (before.ends_with("\xEF\xBF") ? 2 : before.ends_with("\xEF") ? 1 : 0);
}

class Parser {
 public:
  ConfigurationResult parse(std::string_view text) {
    if (text.starts_with("\xEF\xBB\xBF")) text.remove_prefix(3);
    if (const std::size_t valid = validPrefix(text); valid < text.size()) {
      const std::string_view before = text.substr(0, valid);
      const std::size_t lineBegin = before.rfind('\n') + 1;  // 0 where there is no line end
      const auto isFirstByte = [](char character) { return (static_cast<unsigned char>(character) & 0xC0) != 0x80; };
      return refusal(static_cast<std::uint32_t>(std::ranges::count(before, '\n') + 1),
                     static_cast<std::uint32_t>(std::ranges::count_if(before.substr(lineBegin), isFirstByte) + 1),
                     "this is not UTF-8");
    }
    if (std::ranges::count(text, '.') > mostDots) {
      return refusal(1, 1, "more than " + std::to_string(mostDots) + " dots: this is no metric configuration");
    }
    toml::parse_result parsed = toml::parse(withoutForeignCharacters(text));
    if (parsed.failed()) {
      const toml::parse_error& error = parsed.error();
      // The library's descriptions may quote what stands in the file.
      return refusal(error.source().begin.line, error.source().begin.column, onOneLine(error.description()));
    }
    const std::vector<Entry> sections = inFileOrder(parsed.table());
    const auto isKnown = [](const Entry& section) {
      return std::ranges::find(sectionNames, section.first->str()) != std::end(sectionNames);
    };
    // A newer file has sections beside those that we know; one that has others alone was not meant for us.
    if (!sections.empty() && std::ranges::none_of(sections, isKnown)) {
      const toml::key& first = *sections.front().first;
      return refusal(first.source().begin.line, first.source().begin.column,
                     "there is neither [metrics] nor [triggers] here, only " + quotedExcerpt(first.str()) +
                         (sections.size() > 1 ? " and others" : "") + didYouMean(first.str(), sectionNames));
    }
    for (const auto& [key, node] : sections) {
      if (key->str() == "metrics") {
        readSection(*key, *node, &Parser::readMetric);
      } else if (key->str() == "triggers") {
        readSection(*key, *node, &Parser::readTrigger);
      } else {
        note(key->source(), quotedExcerpt(key->str()) + " is neither [metrics] nor [triggers], ignored");
      }
      if (refused_) return std::move(*refused_);
    }
    if (notesLeftOut_ > 0) configuration_.notes.push_back("and " + std::to_string(notesLeftOut_) + " more like these");
    return {std::move(configuration_), {}, 0, 0};
  }

 private:
  using Entry = std::pair<const toml::key*, const toml::node*>;
  // The library sorts by key; messages are to come in the order of the lines.
  static std::vector<Entry> inFileOrder(const toml::table& table) {
    std::vector<Entry> entries;
    for (const auto& [key, node] : table) entries.emplace_back(&key, &node);
    std::ranges::stable_sort(entries, [](const Entry& left, const Entry& right) {
      return left.first->source().begin < right.first->source().begin;
    });
    return entries;
  }

  using ReadEntry = void (Parser::*)(const toml::key& key, const toml::node& node);

  void readSection(const toml::key& name, const toml::node& node, ReadEntry readEntry) {
    const toml::table* const section = node.as_table();
    if (section == nullptr)
      return refuse(node.source(), std::string(name.str()) + " is to be a section: [" + std::string(name.str()) + "]");
    for (const auto& [key, entry] : inFileOrder(*section)) {
      (this->*readEntry)(*key, *entry);
      if (refused_) return;
    }
  }

  void readMetric(const toml::key& key, const toml::node& node) {
    const MetricIdentifier* const metric = metricReferredTo(key.str());
    std::optional<std::chrono::milliseconds> period;
    if (const auto text = node.value_exact<std::string_view>()) {
      if (*text != onChange) return refusePeriod(key, node, quotedExcerpt(*text));
    } else if (const auto number = node.value_exact<std::int64_t>()) {
      if (*number < 1 || *number > longestPeriod) return refusePeriod(key, node, std::to_string(*number));
      period = std::chrono::milliseconds(*number);
    } else {
      return refusePeriod(key, node, "of another kind");
    }
    if (metric == nullptr)
      return note(key.source(), "the metric " + quotedExcerpt(key.str()) + " is not known, ignored");
    if (!configuration_.plan.metrics.emplace(metric->id, period).second) {
      refuse(key.source(),
             std::string(key.str()) + " is the metric " + std::string(metric->name) + ", which has a period already");
    }
  }

  void readTrigger(const toml::key& key, const toml::node& node) {
    const std::optional<std::int64_t> trigger = parseInteger64(key.str());
    if (!trigger)
      return refuse(key.source(),
                    "a trigger is named by its number, such as 0x7F0013, not " + quotedExcerpt(key.str()));
    const toml::array* const array = node.as_array();
    if (array == nullptr) {
      return refuse(node.source(), "a trigger takes a list of metrics, such as [\"K_SIM_FILE_INFO\"]");
    }
    if (configuration_.triggers.contains(*trigger)) {
      return refuse(key.source(), "the trigger " + hexText(*trigger) + " is there twice");
    }
    std::vector<std::int64_t> metrics;
    for (const toml::node& element : *array) {
      const MetricIdentifier* metric = nullptr;
      std::string reference;
      if (const auto text = element.value_exact<std::string_view>()) {
        reference = quotedExcerpt(*text);
        metric = metricReferredTo(*text);
      } else if (const auto number = element.value_exact<std::int64_t>()) {
        reference = hexText(*number);
        metric = metricWithId(*number);
      } else {
        return refuse(element.source(),
                      "a metric is a name, such as \"K_SIM_FILE_INFO\", or a number, such as 0x3C0013");
      }
      if (metric == nullptr) {
        note(element.source(), "the metric " + reference + " is not known, ignored");
      } else if (std::ranges::find(metrics, metric->id) == metrics.end()) {
        metrics.push_back(metric->id);
      }
    }
    configuration_.triggers.emplace(*trigger, std::move(metrics));
  }

  void refusePeriod(const toml::key& key, const toml::node& node, const std::string& what) {
    refuse(node.source(), "the period of " + quotedExcerpt(key.str()) + " is " + what +
                              "; a period is a number of milliseconds, 1 to " + std::to_string(longestPeriod) +
                              ", or \"on change\"");
  }

  void refuse(const toml::source_region& where, const std::string& what) {
    refused_ = refusal(where.begin.line, where.begin.column, what);
  }
  static ConfigurationResult refusal(std::uint32_t line, std::uint32_t column, std::string_view what) {
    std::string error = "line " + std::to_string(line) + ", column " + std::to_string(column) + ": ";
    error += beginningOf(what, longestReason);
    if (what.size() > longestReason) error += "…";
    return {std::nullopt, std::move(error), line, column};
  }
  void note(const toml::source_region& where, const std::string& what) {
    if (configuration_.notes.size() == mostNotes) {
      ++notesLeftOut_;
      return;
    }
    configuration_.notes.push_back("line " + std::to_string(where.begin.line) + ": " + what);
  }

  Configuration configuration_;
  std::optional<ConfigurationResult> refused_;
  std::size_t notesLeftOut_ = 0;
};

}  // namespace

ConfigurationResult parseConfiguration(std::string_view text) {
  try {
    return Parser().parse(text);
  } catch (const BrokenAssertion&) {
    return {std::nullopt, "line 1, column 1: somewhere below, the text is no TOML in a way that cannot be told", 1, 1};
  }
}

}  // namespace probeview
