// SPDX-License-Identifier: Apache-2.0
//
// Apart from the store itself, so that a tool which feeds a store directly does not link the client library.
#include "client/radix_wrapper.h"
#include "platform/console_log.h"
#include "platform/system_log.h"
#include "store/metric_validator.h"

namespace probeview {

MetricValidator& MetricValidator::sharedValidator() {
  static auto* validator = new MetricValidator;
  return *validator;
}

MetricValidator::MetricValidator()
    : MetricValidator(Surroundings{
          .wrapper = &RadixWrapper::sharedInstance(), .console = consoleLog(), .systemLog = systemLog()}) {}

}  // namespace probeview
