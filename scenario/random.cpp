// SPDX-License-Identifier: Apache-2.0
#include "scenario/random.h"

#include <algorithm>

#include "scenario/decibel.h"

namespace probeview::scenario {

double Random::exponential(double mean) {
  constexpr double naturalOfTwo = 0.6931471805599453;
  return mean * std::min(-naturalOfTwo * logarithmOfTwo(1.0 - unit()), 3.0);
}

}  // namespace probeview::scenario
