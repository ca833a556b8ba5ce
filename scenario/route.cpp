// SPDX-License-Identifier: Apache-2.0
#include "scenario/route.h"

#include <algorithm>

#include "platform/fatal_error.h"

namespace probeview::scenario {

Route::Route(std::vector<Waypoint> waypoints) : waypoints_(std::move(waypoints)) {
  if (waypoints_.size() < 2) fatalError("a route needs two waypoints");
  position_ = waypoints_.front().place;
  pauseLeft_ = waypoints_.front().pauseSeconds;
}

Route Route::thereAndBack(std::vector<Waypoint> waypoints) {
  const std::size_t there = waypoints.size();
  // On the way back each leg keeps the speed that it had: the speed of the waypoint at its other end.
  for (std::size_t back = there - 1; back > 0; --back) {
    const double speed = waypoints[back - 1].metresPerSecond;
    if (back == there - 1) {
      waypoints[back].metresPerSecond = speed;
    } else {
      waypoints.push_back({waypoints[back].place, waypoints[back].pauseSeconds, speed});
    }
  }
  return Route(std::move(waypoints));
}

double Route::metresPerSecond() const { return pauseLeft_ > 0 ? 0 : leg().metresPerSecond; }

void Route::advance(double seconds) {
  while (seconds > 0) {
    if (pauseLeft_ > 0) {
      const double stand = std::min(pauseLeft_, seconds);
      pauseLeft_ -= stand;
      seconds -= stand;
      continue;
    }
    const Point way = legEnd() - leg().place;
    const double metres = length(way);
    const double needed = (metres - travelled_) / leg().metresPerSecond;
    if (seconds < needed) {
      travelled_ += seconds * leg().metresPerSecond;
      position_ = leg().place + way * (travelled_ / metres);
      return;
    }
    seconds -= needed;
    leg_ = (leg_ + 1) % waypoints_.size();
    if (leg_ == 0) ++laps_;
    travelled_ = 0;
    position_ = leg().place;
    pauseLeft_ = leg().pauseSeconds;
  }
}

}  // namespace probeview::scenario
