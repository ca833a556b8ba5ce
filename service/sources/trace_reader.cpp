// SPDX-License-Identifier: Apache-2.0
#include "service/sources/trace_reader.h"

#include <array>
#include <cmath>

#include "messages/quantities.h"
#include "service/sources/trace_cell.h"
#include "service/sources/trace_field.h"
#include "values/plain_text.h"
#include "values/printer.h"

namespace probeview {

namespace {

enum Column : std::size_t {
  Timestamp,
  NetworkMode,
  Level,
  Quality,
  SignalToNoise,
  State,
  AreaCode,
  CellIdentity,
  NeighbourLevel,
  NeighbourQuality,
  // What a file may lack.
  NodePart,
  CellPart,
};
constexpr std::size_t neededColumns = NodePart;
constexpr std::array<std::string_view, 12> columnNames = {"Timestamp", "NetworkMode", "RSRP",    "RSRQ",
                                                          "SNR",       "State",       "LACHEX",  "RAWCELLID",
                                                          "NRxRSRP",   "NRxRSRQ",     "NODEHEX", "CELLHEX"};
using Fields = std::array<std::string_view, columnNames.size()>;

// What the logger writes when it knows nothing of a cell, and when it knows nothing of the serving one at all.
constexpr double unknownLevel = -51;
constexpr double unknownQuality = -24;
constexpr double floorLevel = -200;
constexpr double floorQuality = -20;
constexpr double floorSignalToNoise = -30;

struct TechnologyName {
  std::string_view name;
  TraceTechnology technology;
};
constexpr TechnologyName technologyNames[] = {
    {"LTE", TraceTechnology::Lte},    {"5G", TraceTechnology::Lte},     {"UMTS", TraceTechnology::Umts},
    {"HSDPA", TraceTechnology::Umts}, {"HSUPA", TraceTechnology::Umts}, {"HSPA", TraceTechnology::Umts},
    {"HSPA+", TraceTechnology::Umts}, {"GSM", TraceTechnology::Gsm},    {"GPRS", TraceTechnology::Gsm},
    {"EDGE", TraceTechnology::Gsm},
};

// Which quantities a technology's columns hold.
struct TechnologyColumns {
  const Quantity& level;
  const Quantity& quality;
};
TechnologyColumns columnsOf(TraceTechnology technology) {
  switch (technology) {
    case TraceTechnology::Lte:
      break;
    case TraceTechnology::Umts:
      return {quantities::utraRscp, quantities::utraEcNo};
    case TraceTechnology::Gsm:
      return {quantities::gsmRxLev, quantities::gsmRxQual};
  }
  return {quantities::lteRsrp, quantities::lteRsrq};
}

std::optional<std::chrono::milliseconds> parsedTime(std::string_view field) {
  // yyyy.MM.dd_HH.mm.ss
  constexpr std::string_view pattern = "0000.00.00_00.00.00";
  if (field.size() != pattern.size()) return std::nullopt;
  for (std::size_t index = 0; index < pattern.size(); ++index) {
    const bool digit = field[index] >= '0' && field[index] <= '9';
    if (pattern[index] == '0' ? !digit : field[index] != pattern[index]) return std::nullopt;
  }
  const auto number = [field](std::size_t begin, std::size_t length) {
    return *parseNumber<unsigned>(field.substr(begin, length));
  };
  const std::chrono::year_month_day day{std::chrono::year(static_cast<int>(number(0, 4))),
                                        std::chrono::month(number(5, 2)), std::chrono::day(number(8, 2))};
  const unsigned hour = number(11, 2);
  const unsigned minute = number(14, 2);
  const unsigned second = number(17, 2);
  if (!day.ok() || hour > 23 || minute > 59 || second > 59) return std::nullopt;
  return std::chrono::sys_days(day).time_since_epoch() + std::chrono::hours(hour) + std::chrono::minutes(minute) +
         std::chrono::seconds(second);
}

// Hands out the lines of a text, without their line ends.
class Lines {
 public:
  explicit Lines(std::string_view text) : rest_(text) {}
  bool next(std::string_view& line) {
    if (rest_.empty()) return false;
    ++number_;
    const std::size_t end = rest_.find('\n');
    line = rest_.substr(0, end);
    rest_.remove_prefix(end == std::string_view::npos ? rest_.size() : end + 1);
    if (line.ends_with('\r')) line.remove_suffix(1);
    return true;
  }
  std::uint32_t number() const { return number_; }

 private:
  std::string_view rest_;
  std::uint32_t number_ = 0;
};

class Reader {
 public:
  explicit Reader(std::string_view text) : lines_(text) {}

  TraceLogResult read() {
    if (std::string error = readHeader(); !error.empty()) return {std::nullopt, std::move(error)};
    std::string_view line;
    while (lines_.next(line)) {
      if (line.empty()) continue;
      if (log_.rows.size() == traceRowLimit) {
        return {std::nullopt, "line " + std::to_string(lines_.number()) + ": more than " +
                                  std::to_string(traceRowLimit) + " rows; split the log"};
      }
      readRow(line);
    }
    endDoubt();
    if (log_.rows.empty()) {
      return {std::nullopt, log_.problems.empty() ? "it has a line of column names, but no rows"
                                                  : "no row is usable; " + log_.problems[0]};
    }
    return {std::move(log_), {}};
  }

 private:
  static constexpr std::size_t absentColumn = static_cast<std::size_t>(-1);

  std::string readHeader() {
    std::string_view line;
    if (!lines_.next(line)) return "it is empty";
    if (line.starts_with("\xEF\xBB\xBF")) line.remove_prefix(3);
    positions_.fill(absentColumn);
    columnCount_ = 0;
    while (true) {
      const std::size_t comma = line.find(',');
      const std::string_view name = line.substr(0, comma);
      for (std::size_t column = 0; column < columnNames.size(); ++column) {
        if (name != columnNames[column]) continue;
        if (positions_[column] != absentColumn) {
          return "line 1: the column " + std::string(name) + " is there twice";
        }
        positions_[column] = columnCount_;
      }
      ++columnCount_;
      if (comma == std::string_view::npos) break;
      line.remove_prefix(comma + 1);
    }
    if (const std::string missing = missingColumns(0, neededColumns, ", "); !missing.empty()) {
      return "line 1 must name the columns of a drive-test log; missing: " + missing;
    }
    if (const std::string missing = missingColumns(neededColumns, columnNames.size(), " and "); !missing.empty()) {
      log_.remark =
          "there is no column " + missing + ", so cell identities cannot be checked; they are taken as they stand";
    }
    return {};
  }

  std::string missingColumns(std::size_t begin, std::size_t end, std::string_view between) const {
    std::string missing;
    for (std::size_t column = begin; column < end; ++column) {
      if (positions_[column] != absentColumn) continue;
      if (!missing.empty()) missing += between;
      missing += columnNames[column];
    }
    return missing;
  }

  void readRow(std::string_view line) {
    if (line.size() > traceLineLengthLimit) {
      return skip("is longer than " + std::to_string(traceLineLengthLimit) + " bytes");
    }
    Fields fields;
    if (const std::size_t count = split(line, fields); count != columnCount_) {
      return skip("has " + std::to_string(count) + " fields, not " + std::to_string(columnCount_));
    }
    TraceRow row;
    row.line = lines_.number();
    const std::optional<std::chrono::milliseconds> time = parsedTime(fields[Timestamp]);
    if (!time) return skip("Timestamp is " + shownField(fields[Timestamp]) + ", not yyyy.MM.dd_HH.mm.ss");
    row.time = *time;
    if (!readTechnology(fields[NetworkMode], row)) {
      return skip("NetworkMode is " + shownField(fields[NetworkMode]) + ", which is no technology that is known");
    }
    if (!readActivity(fields[State], row)) {
      return skip("State is " + shownField(fields[State]) + ", not I, D, V or VD");
    }
    pendingNotes_.clear();
    pendingDoubt_.clear();
    if (row.technology && !readValues(fields, row)) return;
    for (const std::string& note : pendingNotes_) problem(note, keptProblems_);
    tellDoubt();
    log_.rows.push_back(row);
  }

  // The number of fields; those of our columns into `fields`.
  std::size_t split(std::string_view line, Fields& fields) const {
    std::size_t count = 0;
    while (true) {
      const std::size_t comma = line.find(',');
      for (std::size_t column = 0; column < positions_.size(); ++column) {
        if (positions_[column] == count) fields[column] = line.substr(0, comma);
      }
      ++count;
      if (comma == std::string_view::npos) return count;
      line.remove_prefix(comma + 1);
    }
  }

  static bool readTechnology(std::string_view field, TraceRow& row) {
    if (isNoValue(field)) return true;
    for (const TechnologyName& each : technologyNames) {
      if (each.name == field) row.technology = each.technology;
    }
    return row.technology.has_value();
  }

  static bool readActivity(std::string_view field, TraceRow& row) {
    if (isNoValue(field)) return true;
    TraceActivity activity;
    if (field != "I") {
      for (const char letter : field) {
        if (letter != 'D' && letter != 'V') return false;
        bool& seen = letter == 'D' ? activity.data : activity.voice;
        if (seen) return false;
        seen = true;
      }
    }
    row.activity = activity;
    return true;
  }

  // False: the row has been skipped.
  bool readValues(const Fields& fields, TraceRow& row) {
    const TechnologyColumns columns = columnsOf(*row.technology);
    return readServing(fields, columns, row) && readNeighbour(fields, columns, row) && readCell(fields, row);
  }

  bool readServing(const Fields& fields, const TechnologyColumns& columns, TraceRow& row) {
    if (isAtFloor(fields)) return true;
    if (!readNumber(fields, Level, row.level) || !readNumber(fields, Quality, row.quality)) return false;
    if (row.level == unknownLevel) {
      // On GSM the level alone says so, and RXQUAL beside it is one.
      const bool gsm = *row.technology == TraceTechnology::Gsm;
      const bool both = row.quality == unknownQuality;
      if (both || gsm) row.level.reset();
      if (both) row.quality.reset();
    }
    dropUnlessMeasurable(fields, Level, columns.level, row.level);
    dropUnlessMeasurable(fields, Quality, columns.quality, row.quality);
    if (*row.technology != TraceTechnology::Lte) return true;
    if (!readNumber(fields, SignalToNoise, row.signalToNoise)) return false;
    dropUnlessMeasurable(fields, SignalToNoise, quantities::lteSampleSinr, row.signalToNoise);
    return true;
  }

  static bool isAtFloor(const Fields& fields) {
    return parseNumber<double>(fields[Level]) == floorLevel && parseNumber<double>(fields[Quality]) == floorQuality &&
           parseNumber<double>(fields[SignalToNoise]) == floorSignalToNoise;
  }

  bool readNeighbour(const Fields& fields, const TechnologyColumns& columns, TraceRow& row) {
    if (!readNumber(fields, NeighbourLevel, row.neighbourLevel) ||
        !readNumber(fields, NeighbourQuality, row.neighbourQuality)) {
      return false;
    }
    if (row.neighbourLevel == unknownLevel && row.neighbourQuality.value_or(unknownQuality) == unknownQuality) {
      row.neighbourLevel.reset();
      row.neighbourQuality.reset();
    }
    dropUnlessMeasurable(fields, NeighbourLevel, columns.level, row.neighbourLevel);
    dropUnlessMeasurable(fields, NeighbourQuality, columns.quality, row.neighbourQuality);
    return true;
  }

  bool readNumber(const Fields& fields, Column column, std::optional<double>& number) {
    const std::string_view field = fields[column];
    if (isNoValue(field)) return true;
    number = parseNumber<double>(field);
    if (number && std::isfinite(*number)) return true;
    skip(std::string(columnNames[column]) + " is " + shownField(field) + ", not a number");
    return false;
  }

  bool readCell(const Fields& fields, TraceRow& row) {
    std::optional<std::uint64_t> identity;
    std::optional<std::uint32_t> area;
    if (!isNoValue(fields[CellIdentity])) {
      identity = parseNumber<std::uint64_t>(fields[CellIdentity]);
      if (!identity) return skip("RAWCELLID is " + shownField(fields[CellIdentity]) + ", not a number"), false;
    }
    if (!isNoValue(fields[AreaCode])) {
      area = parseNumber<std::uint32_t>(fields[AreaCode], 16);
      if (!area || *area > quantities::trackingAreaCode.numbers.highest) {
        return skip("LACHEX is " + shownField(fields[AreaCode]) + ", not an area code of 16 bits in hexadecimal"),
               false;
      }
    }
    const bool checked = positions_[NodePart] != absentColumn && positions_[CellPart] != absentColumn;
    TraceCell cell =
        traceCell(*row.technology, identity.value_or(0),
                  checked ? std::optional<TraceCellParts>({fields[NodePart], fields[CellPart]}) : std::nullopt);
    pendingDoubt_ = std::move(cell.doubt);
    // An area is that of the cell; whose is it, when the cell is not known?
    if (!cell.identity && (checked || !pendingDoubt_.empty())) return true;
    // 0 and FFFE stand for "no area" (3GPP TS 23.003, 4.1 and 19.4.2.3): the phone is between two cells, and the
    // identity in such a row often is still, or already, that of a cell of the other technology.
    if (area == 0u || area == 0xFFFEu) return true;
    row.areaCode = area;
    row.cellIdentity = cell.identity;
    return true;
  }

  void dropUnlessMeasurable(const Fields& fields, Column column, const Quantity& quantity,
                            std::optional<double>& number) {
    if (!number || quantity.isMeasurable(*number)) return;
    std::string text(columnNames[column]);
    text += ' ';
    text += shownNumber(fields[column]);
    text += " is no ";
    text += quantity.name;
    text += " (";
    printNumber(quantity.measurable.lowest, text);
    text += " to ";
    printNumber(quantity.measurable.highest, text);
    if (!quantity.unit.empty()) text += ' ';
    text += quantity.unit;
    text += "), left out";
    note(std::move(text));
    number.reset();
  }

  // Rows in a row whose cell is not known are one problem: told with the first of them, counted with the last.
  void tellDoubt() {
    if (pendingDoubt_.empty()) return endDoubt();
    if (doubtedRows_ == 0) {
      doubtIsKept_ = keptDoubts_ < traceProblemsKept;
      doubtPosition_ = log_.problems.size();
      problem(pendingDoubt_ + ", cell and area left out", keptDoubts_);
    }
    ++doubtedRows_;
    lastDoubtedLine_ = lines_.number();
  }
  void endDoubt() {
    if (doubtedRows_ > 1 && doubtIsKept_) {
      log_.problems[doubtPosition_] +=
          "; so in " + std::to_string(doubtedRows_) + " rows, to line " + std::to_string(lastDoubtedLine_);
    }
    doubtedRows_ = 0;
  }

  void note(std::string text) { pendingNotes_.push_back(std::move(text)); }
  void skip(const std::string& what) {
    ++log_.rowsSkipped;
    problem(what + "; row skipped", keptProblems_);
  }
  void problem(const std::string& what, std::size_t& kept) {
    ++log_.problemCount;
    if (kept == traceProblemsKept) return;
    ++kept;
    log_.problems.push_back("line " + std::to_string(lines_.number()) + ": " + what);
  }

  Lines lines_;
  std::array<std::size_t, columnNames.size()> positions_{};
  std::size_t columnCount_ = 0;
  // Of the row that is being read.
  std::vector<std::string> pendingNotes_;
  std::string pendingDoubt_;
  // Of the run of rows whose cell is not known, up to here.
  std::size_t doubtedRows_ = 0;
  std::uint32_t lastDoubtedLine_ = 0;
  std::size_t doubtPosition_ = 0;  // among the problems, where it is kept
  bool doubtIsKept_ = false;
  TraceLog log_;
  // How many of its problems are of this kind.
  std::size_t keptProblems_ = 0;
  std::size_t keptDoubts_ = 0;
};

}  // namespace

TraceLogResult readTraceLog(std::string_view text) { return Reader(text).read(); }

}  // namespace probeview
