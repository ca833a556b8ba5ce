// SPDX-License-Identifier: Apache-2.0
#include "app/fill_watch.h"

namespace probeview {

bool FillWatch::isFilled() {
  std::size_t kinds = 0;
  for (std::size_t index = 0; index < displayDictionaryCount; ++index) {
    kinds += store_.displayDictionary(static_cast<DisplayDictionary>(index)).has_value() ? 1 : 0;
  }
  if (kinds != kinds_) {
    kinds_ = kinds;
    lastChange_ = clock_.monotonicTime();
  }
  return kinds_ > 0 && clock_.monotonicTime() - lastChange_ >= quiet;
}

}  // namespace probeview
