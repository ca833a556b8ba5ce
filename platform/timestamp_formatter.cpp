// SPDX-License-Identifier: Apache-2.0
#include "platform/timestamp_formatter.h"

#include <charconv>
#include <cmath>

#include "platform/fatal_error.h"

namespace probeview {

namespace {

constexpr std::int64_t secondsPerDay = 86'400;
// The double below the largest 64-bit second, with room for any zone's offset.
constexpr double secondsLimit = 9.2e18;

struct CivilDate {
  std::int64_t year;
  unsigned month;  // 1 to 12
  unsigned day;    // 1 to 31
};

// Days are counted from 0000-03-01, so that a leap day is the last of its year, in eras of 400 years.
CivilDate civilDate(std::int64_t daysSince1970) {
  constexpr std::int64_t daysPerEra = 146'097;
  constexpr std::int64_t daysFrom0000To1970 = 719'468;
  const std::int64_t days = daysSince1970 + daysFrom0000To1970;
  const std::int64_t era = (days >= 0 ? days : days - (daysPerEra - 1)) / daysPerEra;
  const auto dayOfEra = static_cast<unsigned>(days - era * daysPerEra);
  const unsigned yearOfEra = (dayOfEra - dayOfEra / 1460 + dayOfEra / 36'524 - dayOfEra / 146'096) / 365;
  const unsigned dayOfYear = dayOfEra - (365 * yearOfEra + yearOfEra / 4 - yearOfEra / 100);
  const unsigned marchMonth = (5 * dayOfYear + 2) / 153;
  const unsigned day = dayOfYear - (153 * marchMonth + 2) / 5 + 1;
  const unsigned month = marchMonth < 10 ? marchMonth + 3 : marchMonth - 9;
  return {static_cast<std::int64_t>(yearOfEra) + era * 400 + (month <= 2 ? 1 : 0), month, day};
}

void appendTwoDigits(unsigned number, std::string& out) {
  out += static_cast<char>('0' + number / 10);
  out += static_cast<char>('0' + number % 10);
}

void appendYear(std::int64_t year, std::string& out) {
  if (year < 0) out += '-';
  char digits[24];
  const auto [end, error] = std::to_chars(digits, digits + sizeof digits, year < 0 ? -year : year);
  const auto count = static_cast<std::size_t>(end - digits);
  if (count < 4) out.append(4 - count, '0');
  out.append(digits, count);
}

}  // namespace

TimestampFormatter::TimestampFormatter(const TimeZone& zone) : zone_(zone) {}

std::string_view TimestampFormatter::format(double milliseconds) {
  const double seconds = std::floor(milliseconds / 1000.0);
  // Written so that a NaN stops, too.
  if (!(std::fabs(seconds) <= secondsLimit)) fatalError("a timestamp is not a point in time");
  const auto second = static_cast<std::int64_t>(seconds);
  if (second_ != second) formatSecond(second);
  return text_;
}

void TimestampFormatter::formatSecond(std::int64_t utcSeconds) {
  if (!period_ || utcSeconds < period_->from || utcSeconds >= period_->until) period_ = zone_.periodAt(utcSeconds);
  const std::int64_t local = utcSeconds + period_->offset;
  std::int64_t day = local / secondsPerDay;
  auto secondOfDay = static_cast<std::int32_t>(local % secondsPerDay);
  if (secondOfDay < 0) {
    --day;
    secondOfDay += static_cast<std::int32_t>(secondsPerDay);
  }
  if (day_ != day) {
    const CivilDate date = civilDate(day);
    text_.clear();
    appendYear(date.year, text_);
    text_ += '-';
    appendTwoDigits(date.month, text_);
    text_ += '-';
    appendTwoDigits(date.day, text_);
    text_ += ' ';
    dateSize_ = text_.size();
    day_ = day;
  }
  const auto ofDay = static_cast<unsigned>(secondOfDay);
  text_.resize(dateSize_);
  appendTwoDigits(ofDay / 3600, text_);
  text_ += ':';
  appendTwoDigits(ofDay / 60 % 60, text_);
  text_ += ':';
  appendTwoDigits(ofDay % 60, text_);
  text_ += ' ';
  text_ += period_->abbreviation;
  second_ = utcSeconds;
}

}  // namespace probeview
