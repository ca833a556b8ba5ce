// SPDX-License-Identifier: Apache-2.0
//
// What the made-up network broadcasts and configures about changing cells: the same numbers decide in the model and
// stand in the reports. Levels in dBm, differences in dB, times in ms.
#pragma once

#include "scenario/facts.h"

namespace probeview::scenario {

// E-UTRA idle mode (3GPP TS 36.304, 5.2.4.5).
struct LteSelection {
  static constexpr int kQRxLevMin = -124;
  static constexpr int kQQualMin = -19;
  static constexpr int kHysteresis = 3;
  static constexpr int kIntraSearchP = 62;
  static constexpr int kNonIntraSearchP = 20;
  static constexpr int kIntraSearchQ = 14;
  static constexpr int kNonIntraSearchQ = 6;
  static constexpr int kServingLowP = 10;     // below -114 dBm lower priorities are good enough
  static constexpr int kCandidateHighP = 18;  // a higher priority has to reach -106 dBm
  static constexpr int kCandidateLowP = 14;
  static constexpr int kCandidateHighQ = 6;
  static constexpr int kCandidateLowQ = 4;
  static constexpr int kMaximumPower = 23;
  static constexpr Milliseconds kReselectionTime = 1000;
};

// E-UTRA connected mode: event A3 between cells, A5 between carriers, B2 towards other technologies (3GPP TS 36.331,
// 5.5.4).
struct LteMobility {
  static constexpr double kA3Offset = 2;
  static constexpr double kHysteresis = 1;
  static constexpr Milliseconds kTimeToTrigger = 480;
  static constexpr double kA5Serving = -109;
  static constexpr double kA5Candidate = -105;
  static constexpr double kB2Serving = -115;
  static constexpr double kB2Umts = -106;
  static constexpr double kB2Gsm = -98;
};

// E-UTRA radio link supervision (3GPP TS 36.331, 5.3.11; 36.133, 7.6).
struct LteSupervision {
  static constexpr double kOutOfSync = -8;
  static constexpr double kInSync = -6;
  static constexpr int kN310 = 2;
  static constexpr Milliseconds kT310 = 1000;
  static constexpr Milliseconds kT311 = 3000;
};

// C-DRX (3GPP TS 36.321, 5.7), in ms.
struct LteDrx {
  static constexpr unsigned kOnDuration = 10;
  static constexpr unsigned kInactivity = 100;
  static constexpr unsigned kRetransmission = 8;
  static constexpr unsigned kLongCycle = 320;
  static constexpr unsigned kShortCycle = 40;
  static constexpr unsigned kShortCycles = 4;
};

// UTRA (3GPP TS 25.304, 5.2.6; 25.331, 14.1.2.4 for event 1D).
struct UmtsSelection {
  static constexpr int kQRxLevMin = -115;
  static constexpr int kQQualMin = -18;
  static constexpr int kHysteresis = 4;
  static constexpr int kIntraSearch = 10;
  static constexpr int kInterSearch = 6;
  static constexpr int kSearchRat = 4;
  static constexpr int kLteHigh = -108;  // RSRP that E-UTRA, of higher priority, has to reach
  static constexpr int kServingLow = -110;
  static constexpr int kGsmLow = -100;
  static constexpr Milliseconds kReselectionTime = 1000;
  static constexpr Milliseconds kTimeToTrigger = 640;
  static constexpr Milliseconds kToLteTime = 1600;
};

// GSM (3GPP TS 45.008, 6).
struct GsmSelection {
  static constexpr int kRxLevAccessMin = -106;
  static constexpr int kReselectHysteresis = 6;
  static constexpr int kUmtsHigh = -104;
  static constexpr int kLteHigh = -108;
  static constexpr Milliseconds kReselectionTime = 2000;
  static constexpr double kHandoverMargin = 5;
  static constexpr Milliseconds kHandoverTime = 960;
  static constexpr int kMaximumPower = 33;  // dBm, class 4 in the 900 MHz band
};

}  // namespace probeview::scenario
