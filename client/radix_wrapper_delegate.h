// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "values/dictionary.h"

namespace probeview {

// Takes the service's events, on the main queue. The argument is the event's content; null when the platform delivered
// none.
class RadixWrapperDelegate {
 public:
  virtual ~RadixWrapperDelegate() = default;
  virtual void eventsDidUpdate(const Dictionary* event) = 0;
  virtual void metricsDidUpdate(const Dictionary* event) = 0;
};

}  // namespace probeview
