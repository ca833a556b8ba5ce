// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ui/front.h"

namespace probeview {

// Hears of the application's life. Main thread.
class ApplicationDelegate {
 public:
  virtual ~ApplicationDelegate() = default;

  // The application's main window; set by the application's main loop, absent before.
  Front* window = nullptr;

  // False would mean that the application is not to go on.
  virtual bool didFinishLaunchingWithOptions() = 0;
  virtual void applicationWillResignActive() = 0;
  virtual void applicationDidEnterBackground() = 0;
  virtual void applicationWillEnterForeground() = 0;
  virtual void applicationDidBecomeActive() = 0;
  virtual void applicationWillTerminate() = 0;
};

// Lets the application launch and does nothing else: the session is the root navigation controller's.
class AppDelegate final : public ApplicationDelegate {
 public:
  bool didFinishLaunchingWithOptions() override { return true; }
  void applicationWillResignActive() override {}
  void applicationDidEnterBackground() override {}
  void applicationWillEnterForeground() override {}
  void applicationDidBecomeActive() override {}
  void applicationWillTerminate() override {}
};

}  // namespace probeview
