// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <initializer_list>
#include <string>
#include <vector>

#include "values/json.h"
#include "values/value.h"

namespace probeview {

inline Value bytesOf(std::initializer_list<std::uint8_t> bytes) {
  return Value::bytes(std::vector<std::uint8_t>(bytes));
}

inline std::string json(const Value& value) {
  std::string out;
  appendJson(value, out);
  return out;
}

}  // namespace probeview
