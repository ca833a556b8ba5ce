// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <vector>

#include "scenario/plane.h"

namespace probeview::scenario {

// A place on the way: how long to stand there, and how fast to go on from it.
struct Waypoint {
  Point place;
  double pauseSeconds = 0;
  double metresPerSecond = 10;
};

// A closed way through a scenario, travelled round and round.
class Route {
 public:
  // At least two waypoints, with some way between them.
  explicit Route(std::vector<Waypoint> waypoints);

  // The same way there and back again.
  static Route thereAndBack(std::vector<Waypoint> waypoints);

  void advance(double seconds);
  Point position() const { return position_; }
  // 0 while standing.
  double metresPerSecond() const;
  // How often the whole way has been travelled.
  int laps() const { return laps_; }

 private:
  const Waypoint& leg() const { return waypoints_[leg_]; }
  Point legEnd() const { return waypoints_[(leg_ + 1) % waypoints_.size()].place; }

  std::vector<Waypoint> waypoints_;
  std::size_t leg_ = 0;
  double travelled_ = 0;  // metres on this leg
  double pauseLeft_ = 0;  // seconds
  Point position_;
  int laps_ = 0;
};

}  // namespace probeview::scenario
