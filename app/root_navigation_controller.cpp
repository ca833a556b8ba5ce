// SPDX-License-Identifier: Apache-2.0
#include "app/root_navigation_controller.h"

#include <optional>
#include <string>
#include <utility>

#include "platform/fatal_error.h"
#include "platform/resources.h"

namespace probeview {

SessionProperties::SessionProperties()
    : SessionProperties(&RadixWrapper::sharedInstance(), MetricValidator::sharedValidator()) {}

RootNavigationController::RootNavigationController()
    : SessionProperties(), NavigationStack(InterfaceDescription(PageEnvironment{})), consoleLog_(consoleLog()) {}

RootNavigationController::RootNavigationController(RadixWrapper* wrapper, MetricValidator& validator,
                                                   const PageEnvironment& environment)
    : SessionProperties(wrapper, validator),
      NavigationStack(InterfaceDescription(environment)),
      consoleLog_(environment.consoleLog) {}

RootNavigationController::RootNavigationController(RadixWrapper* wrapper, MetricValidator& validator,
                                                   const PageEnvironment& environment,
                                                   std::unique_ptr<ListPage> rootPage)
    : SessionProperties(wrapper, validator),
      NavigationStack(InterfaceDescription(environment), std::move(rootPage)),
      consoleLog_(environment.consoleLog) {}

void RootNavigationController::viewDidLoad() {
  NavigationStack::viewDidLoad();
  if (myRadixWrapper != nullptr) myRadixWrapper->removeTelemConfigForAppid(myAppID);
  const std::optional<std::string> path = resourcePath(metricFileName, metricFileType);
  metricFileIsMissing_ = !path;
  if (!path) {
    consoleLog_.line("Metric Log File path doesnt exist");
    return;
  }
  consoleLog_.line("pushing metric file");
  if (myRadixWrapper == nullptr) fatalError("there is no client wrapper to push the metric file with");
  if (!myRadixWrapper->addTelemConfigForAppId(myAppID, *path)) return;
  // The store listens since it was made; listening again restarts delivery under the configuration just pushed.
  if (auto* wrapper = myMetricValidator.mySharedRadixInstance()) wrapper->listen();
  consoleLog_.line("Querying SIM files");
  // Trigger 0x7F0013 is the SIM files; the answer comes later, as an ordinary metric event.
  if (myRadixWrapper != nullptr) myRadixWrapper->querySpecificMetric("probeview", 9999, 0, 0x7F0013, 0, 0);
}

void RootNavigationController::didReceiveMemoryWarning() { NavigationStack::didReceiveMemoryWarning(); }

}  // namespace probeview
