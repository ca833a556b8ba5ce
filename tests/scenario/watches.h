// SPDX-License-Identifier: Apache-2.0
//
// Clients that do not trust what they are told: each remembers what the records of one technology have said, and holds
// every new one against it.
#pragma once

#include <array>
#include <chrono>
#include <cstdint>
#include <optional>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include "source/metric_source.h"
#include "tests/scenario/findings.h"

namespace probeview {

using Moment = std::chrono::milliseconds;

// How a drive is listened to.
struct Listening {
  bool everyChange = true;  // nothing is held back by a period that a client asked for
  bool soak = false;        // what does not serve is told again and again, as it was last
};

// A channel number and the number by which a cell of it is known.
using CellName = std::pair<std::uint32_t, std::uint32_t>;

// The moments at which things were told that change together.
class Together {
 public:
  explicit Together(std::size_t count) : times_(count) {}
  void told(std::size_t which, Moment time) { times_[which] = time; }
  // Whether all were told last at the time.
  bool allAt(Moment time) const {
    for (const auto& told : times_) {
      if (told != time) return false;
    }
    return true;
  }

 private:
  std::vector<std::optional<Moment>> times_;
};

// A technology's state, now and as it was when something was measured that is told a moment later.
class StateHistory {
 public:
  void becomes(std::int32_t state, Moment time);
  std::optional<std::int32_t> now() const;
  std::optional<std::int32_t> at(Moment time) const;
  Moment since() const { return states_.empty() ? Moment{} : states_.back().second; }

 private:
  std::vector<std::pair<std::int32_t, Moment>> states_;
};

class LteWatch {
 public:
  LteWatch(Findings& findings, Listening how) : findings_(findings), how_(how) {}
  void see(const MetricRecord& record);
  // All that belongs to the moment has been told.
  void settle(Moment time);

  bool serves() const;
  bool isOver() const;
  Moment overSince() const { return states_.since(); }

 private:
  void seeState(const MetricRecord& record);
  void seeDrx(const MetricRecord& record);
  void seeCell(const MetricRecord& record);
  void seeSelection(const MetricRecord& record);
  void seeCarriers(const MetricRecord& record);
  void seeAggregation(const MetricRecord& record);
  void seeSamples(const MetricRecord& record);
  void seePower(const MetricRecord& record);
  void seeNeighbours(const MetricRecord& record);
  void seeOtherNeighbours(const MetricRecord& record);

  struct Secondary {
    CellName cell;
    std::int32_t state = 0;
    std::uint32_t index = 0;
  };

  Findings& findings_;
  Listening how_;
  StateHistory states_;
  std::optional<std::int32_t> drxState_;  // that C-DRX named
  std::optional<CellName> serving_;
  std::optional<Moment> cellChangedAt_;
  Together together_{3};
  std::vector<std::uint32_t> carriers_;  // EARFCNs, the primary's first
  std::vector<Secondary> secondaries_;
  std::set<CellName> configured_;  // secondary carriers of this connection, or of the last one
};

class UmtsWatch {
 public:
  UmtsWatch(Findings& findings, Listening how) : findings_(findings), how_(how) {}
  void see(const MetricRecord& record);
  void settle(Moment time);

  bool serves() const;
  bool isOver() const;
  Moment overSince() const { return states_.since(); }

 private:
  void seeState(const MetricRecord& record);
  void seeNeighbours(const MetricRecord& record);
  void seeMeasurement(const MetricRecord& record);
  void seeSelection(const MetricRecord& record);

  Findings& findings_;
  Listening how_;
  StateHistory states_;
  std::optional<CellName> serving_;
  std::optional<Moment> cellChangedAt_;
  Together together_{2};
  std::optional<std::pair<bool, bool>> configuration_;  // whether there is a DRX cycle, and a second carrier
  std::optional<bool> connectedMode_;
};

class GsmWatch {
 public:
  GsmWatch(Findings& findings, Listening how) : findings_(findings), how_(how) {}
  void see(const MetricRecord& record);
  void settle(Moment time);

  // Whether the last that was told is that no channel is dedicated and no cell serves.
  bool isOver() const;
  Moment overSince() const { return stateTime_; }

 private:
  void seeIdleConfiguration(const MetricRecord& record);
  void seeNeighbours(const MetricRecord& record);

  Findings& findings_;
  Listening how_;
  StateHistory states_;
  Moment stateTime_{};
  Moment latest_{};
  bool servesCell_ = false;
  std::optional<CellName> serving_;
  std::optional<Moment> cellChangedAt_;
  Together together_{3};
};

class MobilityWatch {
 public:
  explicit MobilityWatch(Findings& findings) : findings_(findings) {}
  void see(const MetricRecord& record);
  bool lostService() const { return lostService_; }

 private:
  void seeFiles(const MetricRecord& record);

  Findings& findings_;
  bool lostService_ = false;
};

// The whole phone.
class PhoneWatch {
 public:
  PhoneWatch(Findings& findings, Listening how)
      : findings_(findings),
        how_(how),
        lte_(findings, how),
        umts_(findings, how),
        gsm_(findings, how),
        mobility_(findings) {}
  // Records in the order in which they come.
  void see(const MetricRecord& record);

 private:
  void watchTechnology(const MetricRecord& record, char technology);
  void arrive(char technology, Moment time);

  Findings& findings_;
  Listening how_;
  LteWatch lte_;
  UmtsWatch umts_;
  GsmWatch gsm_;
  MobilityWatch mobility_;
  std::optional<Moment> start_;
  Moment now_{};
  char technology_ = ' ';
  std::map<char, Moment> leftAt_;
  std::map<std::int64_t, Moment> last_;
};

}  // namespace probeview
