// SPDX-License-Identifier: Apache-2.0
//
// The phone's SIM card: the elementary files that a metric reports, as 3GPP TS 31.102, 4.2 lays them out, for a
// subscriber of the test PLMN 001/01 whom there is not.
#pragma once

#include <array>
#include <cstdint>
#include <vector>

#include "scenario/registration.h"

namespace probeview::scenario {

// The PLMN of a mobile network code, in three bytes (3GPP TS 24.008, 10.5.1.13).
std::array<std::uint8_t, 3> encodedPlmn(std::uint32_t code = networkCode);

// 001010123456789 as a mobile identity (3GPP TS 24.008, 10.5.1.4) without its length.
std::array<std::uint8_t, 8> encodedImsi();

struct SimFile {
  std::uint32_t identifier = 0;  // such as 0x6F07
  std::vector<std::uint8_t> content;
};

// EF_ICCID, EF_IMSI, EF_AD, EF_UST, EF_SPN, EF_FPLMN, and what mobility management keeps in EF_LOCI, EF_PSLOCI and
// EF_EPSLOCI.
std::vector<SimFile> simFiles(const Registration& registration);

}  // namespace probeview::scenario
