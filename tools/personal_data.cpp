// SPDX-License-Identifier: Apache-2.0
#include "tools/personal_data.h"

#include <algorithm>
#include <iterator>
#include <string_view>

namespace probeview {

namespace {

constexpr std::string_view personalKeys[] = {
    "imsi", "tmsi", "p_tmsi", "m_tmsi", "guti", "pdp_addr", "primary_dns_addr", "secondary_dns_addr", "content",
};

void hide(Value& value) {
  if (Dictionary* const dictionary = value.mutableDictionary()) {
    hidePersonalData(*dictionary);
  } else if (List* const list = value.mutableList()) {
    for (Value& element : *list) hide(element);
  }
}

}  // namespace

void hidePersonalData(Dictionary& dictionary) {
  for (auto& [key, value] : dictionary) {
    if (std::ranges::find(personalKeys, key.text()) != std::end(personalKeys)) {
      value = Value::constant("…");
    } else {
      hide(value);
    }
  }
}

}  // namespace probeview
