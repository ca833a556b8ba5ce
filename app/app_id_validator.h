// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <optional>
#include <string>

#include "values/dictionary.h"

namespace probeview {

// Checks the application identifier of an event. Stands alone: nothing else in the program makes one.
class AppIDValidator {
 public:
  AppIDValidator() = default;
  virtual ~AppIDValidator() = default;

  std::int64_t myAppID = 2;
  std::string appIDKey = "kKeyAppID";
  // The identifier of the event validated last; absent when it carried no integer. A subclass that overrides it is
  // asked for the value that is compared.
  virtual std::optional<std::int64_t> appID() const { return appID_; }
  virtual void setAppID(std::optional<std::int64_t> appID) { appID_ = appID; }

  // Whether the event's identifier is there and equal to 2; that number is fixed and does not follow myAppID.
  bool validate(const Dictionary& event);

 private:
  std::optional<std::int64_t> appID_;
};

}  // namespace probeview
