// SPDX-License-Identifier: Apache-2.0
//
// Apart from the wrapper itself, so that a program which brings its own manager does not link the library's.
#include "client/radix_wrapper.h"
#include "platform/main_queue.h"
#include "platform/system_log.h"

namespace probeview {

RadixWrapper& RadixWrapper::sharedInstance() {
  static auto* instance = new RadixWrapper(radix::client::CreateManager("probeview", queue()),
                                           {.mainQueue = mainQueue(), .systemLog = systemLog()});
  return *instance;
}

}  // namespace probeview
