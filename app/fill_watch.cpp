// SPDX-License-Identifier: Apache-2.0
#include "app/fill_watch.h"

#include <algorithm>

#include "store/handlers.h"

namespace probeview {

bool FillWatch::isFilled() {
  const auto hasCome = [&](DisplayDictionary which) { return store_.displayDictionary(which).has_value(); };
  std::size_t kinds = 0;
  for (std::size_t index = 0; index < displayDictionaryCount; ++index) {
    kinds += hasCome(static_cast<DisplayDictionary>(index)) ? 1 : 0;
  }
  if (kinds == 0) return false;
  if (!expected_ && clock_.monotonicTime() >= nextQuestion_) {
    if (const auto fillable = fillableMetrics_()) {
      expected_.emplace();
      for (const auto metric : *fillable) {
        // What nobody handles never shows.
        if (const auto* handled = handledMetric(metric)) expected_->insert(handled->dictionary);
      }
    }
    nextQuestion_ = clock_.monotonicTime() + askAgainAfter;
  }
  if (kinds != kinds_) {
    kinds_ = kinds;
    lastChange_ = clock_.monotonicTime();
  }
  if (expected_) return std::all_of(expected_->begin(), expected_->end(), hasCome);
  return clock_.monotonicTime() - lastChange_ >= quiet;
}

}  // namespace probeview
