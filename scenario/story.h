// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <vector>

#include "scenario/facts.h"

namespace probeview::scenario {

// What a scenario tells: facts that are learnt as simulated time goes by, each of which can be put into a payload.
class Story {
 public:
  virtual ~Story() = default;

  // One step of stepTime; the first one is the beginning.
  virtual void advance() = 0;
  // Negative before the beginning.
  virtual Milliseconds now() const = 0;
  virtual const Facts& facts() const = 0;
  // What there is to tell about the fact now, as an encoded message with the timestamp, in ms since 1970-01-01 UTC.
  virtual std::vector<std::uint8_t> tell(Fact fact, std::uint64_t timestamp) = 0;
};

}  // namespace probeview::scenario
