// SPDX-License-Identifier: Apache-2.0
#include "tools/reply_reader.h"

#include <cmath>

#include "values/plain_text.h"
#include "values/printer.h"

namespace probeview {

namespace {

constexpr double highestRate = 1e9;

std::string oneDecimal(double number) {
  // Without the process's locale, which may have a comma.
  const auto tenths = static_cast<std::uint64_t>(number * 10 + 0.5);
  return std::to_string(tenths / 10) + "." + std::to_string(tenths % 10);
}

}  // namespace

std::string ReplyReader::text(std::string_view key) const {
  const Value* value = reply_->find(key);
  if (value == nullptr || value->list() != nullptr || value->dictionary() != nullptr || value->bytes()) return "?";
  const std::string bare = bareText(*value);
  std::string line = onOneLine(beginningOf(bare, longestText));
  if (bare.size() > longestText) line += "…";
  return line;
}

bool ReplyReader::truth(std::string_view key) const {
  const Value* value = reply_->find(key);
  return value != nullptr && value->boolean().value_or(false);
}

std::optional<std::uint64_t> ReplyReader::count(std::string_view key) const {
  const Value* value = reply_->find(key);
  if (value == nullptr) return std::nullopt;
  if (value->kind() == ValueKind::UInt64) return value->rawUInt64();
  if (value->kind() == ValueKind::UInt32) return value->rawUInt32();
  const std::optional<std::int64_t> number =
      value->kind() == ValueKind::Int32 ? std::optional<std::int64_t>(value->rawInt32()) : value->int64();
  if (!number || *number < 0) return std::nullopt;
  return static_cast<std::uint64_t>(*number);
}

std::optional<double> ReplyReader::rate(std::string_view key) const {
  const Value* value = reply_->find(key);
  const std::optional<double> number = value != nullptr ? value->real() : std::nullopt;
  // Written so that what is no number is absent, too.
  return number && *number >= 0 && *number <= highestRate ? number : std::nullopt;
}

std::optional<std::chrono::milliseconds> ReplyReader::duration(std::string_view key) const {
  const std::optional<std::uint64_t> number = count(key);
  if (!number || *number > static_cast<std::uint64_t>(latestTime)) return std::nullopt;
  return std::chrono::milliseconds(static_cast<std::int64_t>(*number));
}

std::vector<ReplyReader> ReplyReader::entries(std::string_view key) const {
  std::vector<ReplyReader> found;
  const Value* value = reply_->find(key);
  if (value == nullptr || value->list() == nullptr) return found;
  for (const Value& entry : *value->list()) {
    if (found.size() == mostEntries) break;
    if (entry.dictionary() != nullptr) found.emplace_back(*entry.dictionary());
  }
  return found;
}

std::size_t ReplyReader::entriesLeftOut(std::string_view key) const {
  const Value* value = reply_->find(key);
  return value != nullptr && value->list() != nullptr ? value->list()->size() - entries(key).size() : 0;
}

std::string countText(std::optional<std::uint64_t> count) { return count ? std::to_string(*count) : "?"; }

std::string rateText(std::optional<double> perSecond) { return (perSecond ? oneDecimal(*perSecond) : "?") + "/s"; }

std::string durationText(std::optional<std::chrono::milliseconds> duration) {
  if (!duration || duration->count() < 0) return "?";
  const std::int64_t milliseconds = duration->count();
  const std::int64_t seconds = milliseconds / 1000;
  if (seconds < 60) return oneDecimal(static_cast<double>(milliseconds) / 1000) + " s";
  if (seconds < 3600) return std::to_string(seconds / 60) + " min " + std::to_string(seconds % 60) + " s";
  return std::to_string(seconds / 3600) + " h " + std::to_string(seconds / 60 % 60) + " min";
}

}  // namespace probeview
