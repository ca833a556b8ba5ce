// SPDX-License-Identifier: Apache-2.0
//
// What the frame about the sources says, in the words of the client library.
#pragma once

#include <cstddef>
#include <vector>

#include "radix/client.h"
#include "radix/frames.h"

namespace radix {

struct SourceStates {
  // What is past these, or past radix::mostMetrics of one source, is left out or cut, by the side that says it and by
  // the side that hears it.
  static constexpr std::size_t most = 32;
  std::vector<client::SourceState> states{};
  // A source or a metric of one has been left out: what is not told may be there all the same.
  bool isCut = false;
};

// Always fits into a frame.
FrameBytes encode(const SourceStates& told);
SourceStates statesOf(const Sources& frame);

}  // namespace radix
