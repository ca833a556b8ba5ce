// SPDX-License-Identifier: Apache-2.0
//
// What the three technologies' parts of the phone have in common.
#pragma once

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <optional>
#include <vector>

#include "scenario/facts.h"
#include "scenario/network.h"
#include "scenario/random.h"
#include "scenario/surroundings.h"
#include "scenario/traffic.h"

namespace probeview::scenario {

// One cell as measured: RSRP and RSRQ, RSCP and Ec/No, or RxLev (and no quality).
struct CellMeasurement {
  CellIndex cell = 0;
  double strength = 0;  // dBm
  double quality = 0;   // dB
};

// The neighbours that a serving cell's measurements list, by technology, strongest first.
struct NeighbourLists {
  std::vector<CellMeasurement> lte;
  std::vector<CellMeasurement> umts;
  std::vector<CellMeasurement> gsm;
};

// Which areas refuse the phone; kept by mobility management.
class ForbiddenAreas {
 public:
  virtual ~ForbiddenAreas() = default;
  // Whether the phone has been told that it may not register in the cell's area.
  virtual bool knownForbidden(CellIndex cell) const = 0;
};

// What a modem part sees at one step.
struct Circumstances {
  Milliseconds now = 0;
  bool measured = false;     // whether the surroundings of the technology in service are new
  bool firstSearch = false;  // just after power-on, when the phone looks through all technologies without patience
  const Network& network;
  const Surroundings& surroundings;
  const ForbiddenAreas& forbidden;
  Demand demand;
  bool mayLeave = true;  // no mobility procedure is under way
  bool voiceOverIms = false;
  Facts& facts;
  Random& random;
};

enum class Manner : std::uint8_t { Reselection, Redirection, Handover, FallbackForVoice };

// The wish to go on in another cell, of another technology or of the same one after service was lost.
struct Departure {
  CellIndex cell = 0;
  Manner manner = Manner::Reselection;
};

// Something that must stay true for a while before it counts: a time to trigger or a reselection timer.
class Pending {
 public:
  // Returns whether the same candidate has been wished for at least the time. No candidate starts over.
  bool holds(std::optional<CellIndex> candidate, Milliseconds now, Milliseconds time) {
    if (candidate != candidate_) {
      candidate_ = candidate;
      since_ = now;
    }
    return candidate_ && now - since_ >= time;
  }
  void clear() { candidate_.reset(); }

 private:
  std::optional<CellIndex> candidate_;
  Milliseconds since_ = 0;
};

// How long the serving cell has been failing, from one look at it to the next.
class FailingCell {
 public:
  void note(bool fails, Milliseconds now) {
    if (!fails) {
      since_ = -1;
    } else if (since_ < 0) {
      since_ = now;
    }
  }
  // It counts as if it had failed from then on.
  void failsSince(Milliseconds time) { since_ = time; }
  bool hasFailedFor(Milliseconds time, Milliseconds now) const { return since_ >= 0 && now - since_ >= time; }
  void clear() { since_ = -1; }

 private:
  Milliseconds since_ = -1;
};

// When a phone in idle mode looks for any other cell, and when it has no service, where it has found none.
constexpr Milliseconds searchAfter = 1200;
constexpr Milliseconds lostAfter = 3000;

// The heard cells of a technology but one, as measurements.
inline void listHeard(const Circumstances& c, Technology technology, std::optional<CellIndex> except, std::size_t most,
                      std::vector<CellMeasurement>& list) {
  list.clear();
  for (const CellIndex cell : c.surroundings.heard(technology)) {
    if (list.size() == most) break;
    if (cell == except) continue;
    list.push_back({cell, c.surroundings.strength(cell), c.surroundings.quality(cell)});
  }
}

inline void listAllHeard(const Circumstances& c, std::optional<CellIndex> except, NeighbourLists& lists) {
  listHeard(c, Technology::Lte, except, 8, lists.lte);
  listHeard(c, Technology::Umts, except, 8, lists.umts);
  listHeard(c, Technology::Gsm, except, 6, lists.gsm);
}

// The strongest cell of a technology in which the phone may register and which is at least so strong.
inline std::optional<CellIndex> strongestAllowed(const Circumstances& c, Technology technology, double least) {
  for (const CellIndex cell : c.surroundings.heard(technology)) {
    if (c.surroundings.strength(cell) < least) return std::nullopt;
    if (!c.forbidden.knownForbidden(cell)) return cell;
  }
  return std::nullopt;
}

// Where a phone would go whose cell has failed, the serving cell included: any cell that is good enough, of the best
// technology first.
std::optional<CellIndex> selectionCandidate(const Circumstances& c);

// The strongest cell of the technology that a connection may go to, if it is stronger than that.
std::optional<CellIndex> strongerCell(const Circumstances& c, Technology technology, CellIndex serving, double level);

}  // namespace probeview::scenario
