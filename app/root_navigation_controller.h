// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <memory>
#include <string>

#include "client/radix_wrapper.h"
#include "store/metric_validator.h"
#include "ui/navigation_stack.h"
#include "ui/page_environment.h"

namespace probeview {

// The properties of the controller below. A base class of their own, because they are set before the container and its
// root page are made: the first access to the store, which makes the wrapper listen, happens here.
struct SessionProperties {
  SessionProperties();  // the process's own wrapper and store
  SessionProperties(RadixWrapper* wrapper, MetricValidator& validator)
      : myRadixWrapper(wrapper), myMetricValidator(validator) {}

  std::string myAppID = "probeview";
  // The application resource that is pushed as the configuration.
  std::string metricFileName = "kiv_test_lte";
  std::string metricFileType = "deviceconfig";
  RadixWrapper* myRadixWrapper;
  MetricValidator& myMetricValidator;
};

// The container of the pages and the owner of the metric session, which begins when its view has loaded and lasts as
// long as the process: nothing stops it, clears its configuration or pushes it again. Main thread.
class RootNavigationController final : public SessionProperties, public NavigationStack {
 public:
  // With the process's own wrapper, store, queues and console log, and the launch list as the root page.
  RootNavigationController();
  RootNavigationController(RadixWrapper* wrapper, MetricValidator& validator, const PageEnvironment& environment);
  // With another root page.
  RootNavigationController(RadixWrapper* wrapper, MetricValidator& validator, const PageEnvironment& environment,
                           std::unique_ptr<ListPage> rootPage);

  // Begins the session: clears an earlier configuration, pushes the configuration file, listens and asks once for the
  // SIM files. Without the file, or when the service refuses it, nothing further is sent. The commands are synchronous.
  void viewDidLoad() override;
  void didReceiveMemoryWarning() override;

  // Whether there was no configuration file to push when the session began; the pages keep their defaults then.
  bool metricFileIsMissing() const { return metricFileIsMissing_; }

 private:
  bool metricFileIsMissing_ = false;
  LineSink& consoleLog_;
};

}  // namespace probeview
