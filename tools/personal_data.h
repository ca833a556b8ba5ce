// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "values/dictionary.h"

namespace probeview {

// Puts "…" in the place of what tells who the subscriber is or where the device can be reached: IMSI, TMSI and GUTI
// (3GPP TS 23.003, 2), addresses, contents of SIM files.
void hidePersonalData(Dictionary& dictionary);

}  // namespace probeview
