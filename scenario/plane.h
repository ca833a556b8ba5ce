// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cmath>

namespace probeview::scenario {

// A place on the plane of a scenario, in metres east and north.
struct Point {
  double x = 0;
  double y = 0;
};

inline Point operator-(Point a, Point b) { return {a.x - b.x, a.y - b.y}; }
inline Point operator+(Point a, Point b) { return {a.x + b.x, a.y + b.y}; }
inline Point operator*(Point a, double factor) { return {a.x * factor, a.y * factor}; }
inline double dot(Point a, Point b) { return a.x * b.x + a.y * b.y; }
// The square root is exact everywhere, which the mathematics library's hypot is not.
inline double length(Point a) { return std::sqrt(dot(a, a)); }

}  // namespace probeview::scenario
