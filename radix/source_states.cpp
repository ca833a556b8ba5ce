// SPDX-License-Identifier: Apache-2.0
#include "radix/source_states.h"

#include <algorithm>
#include <span>

#include "values/plain_text.h"

namespace radix {

namespace {

using client::SourceState;
using probeview::beginningOf;

SourceState::Phase phaseOf(std::uint32_t number) {
  using Phase = SourceState::Phase;
  for (const Phase known : {Phase::Ended, Phase::Failed}) {
    if (number == static_cast<std::uint32_t>(known)) return known;
  }
  // Also what only a later service knows: nothing bad can be said of it.
  return Phase::Running;
}

Sources sourcesOf(std::span<const SourceState> states, bool isCut) {
  Sources frame;
  for (const SourceState& state : states) {
    Source& source = frame.addSource();
    source.setOrigin(beginningOf(state.origin, longestOrigin));
    source.setPhase(static_cast<std::uint32_t>(state.phase));
    if (!state.reason.empty()) source.setReason(beginningOf(state.reason, longestReason));
    isCut = isCut || state.metrics.size() > mostMetrics;
    for (std::size_t index = 0; index < std::min(state.metrics.size(), mostMetrics); ++index) {
      source.addMetric().setIdentifier(unsignedOf(state.metrics[index]));
    }
  }
  if (isCut) frame.setIsCut(true);
  return frame;
}

}  // namespace

FrameBytes encode(const SourceStates& told) {
  // The last ones go when so many of them name so much that no frame holds it.
  for (std::size_t count = std::min(told.states.size(), SourceStates::most);; --count) {
    FrameBytes bytes = encode(sourcesOf(std::span(told.states).first(count), told.isCut || count < told.states.size()));
    if (count == 0 || bytes->size() <= longestFrame) return bytes;
  }
}

SourceStates statesOf(const Sources& frame) {
  SourceStates told;
  told.isCut = frame.isCut();
  for (const Source& source : frame.sources()) {
    if (told.states.size() == SourceStates::most) {
      told.isCut = true;
      break;
    }
    SourceState& state = told.states.emplace_back();
    state.origin = beginningOf(source.origin(), longestOrigin);
    state.phase = phaseOf(source.phase());
    state.reason = beginningOf(source.reason(), longestReason);
    for (const SourceMetric& metric : source.metrics()) {
      if (state.metrics.size() == mostMetrics) {
        told.isCut = true;
        break;
      }
      state.metrics.push_back(signedOf(metric.identifier()));
    }
  }
  return told;
}

}  // namespace radix
