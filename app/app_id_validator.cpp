// SPDX-License-Identifier: Apache-2.0
#include "app/app_id_validator.h"

namespace probeview {

bool AppIDValidator::validate(const Dictionary& event) {
  const auto* value = event.find(appIDKey);
  setAppID(value != nullptr ? value->int64() : std::nullopt);
  return appID() == 2;
}

}  // namespace probeview
