// SPDX-License-Identifier: Apache-2.0
#include "service/sources/trace_reader.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <cmath>

#include "platform/file_descriptor.h"
#include "service/sources/wire_units.h"
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
};
constexpr std::array<std::string_view, 10> columnNames = {
    "Timestamp", "NetworkMode", "RSRP", "RSRQ", "SNR", "State", "LACHEX", "RAWCELLID", "NRxRSRP", "NRxRSRQ"};
using Fields = std::array<std::string_view, columnNames.size()>;

// The levels that the logger wrote when it knew nothing.
constexpr double unknownLevel = -51;
constexpr double unknownQuality = -24;

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

// Which quantities a technology's columns hold, and how wide its cell identity is.
struct TechnologyColumns {
  const units::Quantity& level;
  const units::Quantity& quality;
  std::uint32_t highestCellIdentity;
};
TechnologyColumns columnsOf(TraceTechnology technology) {
  switch (technology) {
    case TraceTechnology::Lte:
      break;
    case TraceTechnology::Umts:
      return {units::utraRscp, units::utraEcNo, 0xFFFFFFF};
    case TraceTechnology::Gsm:
      return {units::gsmRxLev, units::gsmRxQual, 0xFFFF};
  }
  return {units::lteRsrp, units::lteRsrq, 0xFFFFFFF};
}

// A piece of the file fit for a line of a log: short, and without what a terminal would act upon.
std::string shown(std::string_view field) {
  constexpr std::size_t longest = 40;
  const bool cut = field.size() > longest;
  std::string text = printed(Value::text(field.substr(0, longest)));
  return cut ? text + "…" : text;
}

bool isNoValue(std::string_view field) { return field.empty() || field == "-"; }

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
    std::string missing;
    for (std::size_t column = 0; column < columnNames.size(); ++column) {
      if (positions_[column] != absentColumn) continue;
      if (!missing.empty()) missing += ", ";
      missing += columnNames[column];
    }
    if (missing.empty()) return {};
    return "line 1 must name the columns of a drive-test log; missing: " + missing;
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
    if (!time) return skip("Timestamp is " + shown(fields[Timestamp]) + ", not yyyy.MM.dd_HH.mm.ss");
    row.time = *time;
    if (!readTechnology(fields[NetworkMode], row)) {
      return skip("NetworkMode is " + shown(fields[NetworkMode]) + ", which is no technology that is known");
    }
    if (!readActivity(fields[State], row)) {
      return skip("State is " + shown(fields[State]) + ", not I, D, V or VD");
    }
    pendingNotes_.clear();
    if (row.technology && !readValues(fields, row)) return;
    for (const std::string& note : pendingNotes_) problem(note);
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
    const bool gsm = *row.technology == TraceTechnology::Gsm;
    if (!readPair(fields, Level, Quality, columns, gsm, row.level, row.quality)) return false;
    if (!readPair(fields, NeighbourLevel, NeighbourQuality, columns, gsm, row.neighbourLevel, row.neighbourQuality)) {
      return false;
    }
    if (*row.technology == TraceTechnology::Lte) {
      if (!readNumber(fields, SignalToNoise, row.signalToNoise)) return false;
      dropUnlessMeasurable(SignalToNoise, units::lteSampleSinr, row.signalToNoise);
    }
    return readCell(fields, columns.highestCellIdentity, row);
  }

  bool readPair(const Fields& fields, Column levelColumn, Column qualityColumn, const TechnologyColumns& columns,
                bool gsm, std::optional<double>& level, std::optional<double>& quality) {
    if (!readNumber(fields, levelColumn, level) || !readNumber(fields, qualityColumn, quality)) return false;
    if (level == unknownLevel && (gsm || quality == unknownQuality)) {
      // On GSM the level alone says so; the quality beside it is of no cell either, unless it is a serving RXQUAL.
      level.reset();
      if (!gsm || levelColumn == NeighbourLevel) quality.reset();
    }
    dropUnlessMeasurable(levelColumn, columns.level, level);
    dropUnlessMeasurable(qualityColumn, columns.quality, quality);
    return true;
  }

  bool readNumber(const Fields& fields, Column column, std::optional<double>& number) {
    const std::string_view field = fields[column];
    if (isNoValue(field)) return true;
    number = parseNumber<double>(field);
    if (number && std::isfinite(*number)) return true;
    skip(std::string(columnNames[column]) + " is " + shown(field) + ", not a number");
    return false;
  }

  bool readCell(const Fields& fields, std::uint32_t highestCellIdentity, TraceRow& row) {
    std::optional<std::uint64_t> cell;
    std::optional<std::uint32_t> area;
    if (!isNoValue(fields[CellIdentity])) {
      cell = parseNumber<std::uint64_t>(fields[CellIdentity]);
      if (!cell) return skip("RAWCELLID is " + shown(fields[CellIdentity]) + ", not a number"), false;
    }
    if (!isNoValue(fields[AreaCode])) {
      area = parseNumber<std::uint32_t>(fields[AreaCode], 16);
      if (!area || *area > 0xFFFF) {
        return skip("LACHEX is " + shown(fields[AreaCode]) + ", not an area code of 16 bits in hexadecimal"), false;
      }
    }
    // 0 and FFFE stand for "no area" (3GPP TS 23.003, 4.1 and 19.4.2.3): the phone is between two cells, and the
    // identity in such a row often is still, or already, that of a cell of the other technology.
    if (area == 0u || area == 0xFFFEu) return true;
    row.areaCode = area;
    // The logger writes 0 when it has no cell.
    if (!cell || *cell == 0) return true;
    if (*cell > highestCellIdentity) {
      note("RAWCELLID " + std::to_string(*cell) + " is above " + std::to_string(highestCellIdentity) +
           " and thus no cell of this technology, left out");
      return true;
    }
    row.cellIdentity = static_cast<std::uint32_t>(*cell);
    return true;
  }

  void dropUnlessMeasurable(Column column, const units::Quantity& quantity, std::optional<double>& number) {
    if (!number || quantity.contains(*number)) return;
    std::string text(columnNames[column]);
    text += ' ';
    printNumber(*number, text);
    text += " is no ";
    text += quantity.name;
    text += " (";
    printNumber(quantity.lowest, text);
    text += " to ";
    printNumber(quantity.highest, text);
    if (!quantity.unit.empty()) text += ' ';
    text += quantity.unit;
    text += "), left out";
    note(std::move(text));
    number.reset();
  }

  void note(std::string text) { pendingNotes_.push_back(std::move(text)); }
  void skip(const std::string& what) {
    ++log_.rowsSkipped;
    problem(what + "; row skipped");
  }
  void problem(const std::string& what) {
    ++log_.problemCount;
    if (log_.problems.size() < traceProblemsKept) {
      log_.problems.push_back("line " + std::to_string(lines_.number()) + ": " + what);
    }
  }

  Lines lines_;
  std::array<std::size_t, columnNames.size()> positions_{};
  std::size_t columnCount_ = 0;
  std::vector<std::string> pendingNotes_;
  TraceLog log_;
};

std::string systemError(int number) { return std::generic_category().message(number); }

}  // namespace

TraceLogResult readTraceLog(std::string_view text) { return Reader(text).read(); }

TraceTextResult readTraceFile(const std::string& path) {
  // Without blocking, in case somebody names a pipe that nobody writes to.
  const FileDescriptor file(::open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK));
  if (!file) return {std::nullopt, systemError(errno)};
  struct stat status {};
  std::string error;
  std::string text;
  if (::fstat(file.number(), &status) != 0) {
    error = systemError(errno);
  } else if (!S_ISREG(status.st_mode)) {
    error = "it is no regular file";
  } else if (static_cast<std::uint64_t>(status.st_size) > traceFileSizeLimit) {
    error = "it has " + std::to_string(status.st_size) + " bytes, more than the " + std::to_string(traceFileSizeLimit) +
            " that a trace may have; split it";
  } else {
    text.resize(static_cast<std::size_t>(status.st_size));
    std::size_t length = 0;
    while (length < text.size()) {
      const ssize_t count = ::read(file.number(), text.data() + length, text.size() - length);
      if (count < 0 && errno == EINTR) continue;
      if (count < 0) error = systemError(errno);
      if (count <= 0) break;
      length += static_cast<std::size_t>(count);
    }
    text.resize(length);
  }
  if (!error.empty()) return {std::nullopt, std::move(error)};
  return {std::move(text), {}};
}

}  // namespace probeview
