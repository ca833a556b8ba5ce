// SPDX-License-Identifier: Apache-2.0
//
// What the made-up network broadcasts and configures about changing cells: the same numbers decide in the model and
// stand in the reports. Levels in dBm, differences in dB, times in ms.
#pragma once

#include "scenario/facts.h"

namespace probeview::scenario {

// E-UTRA idle mode (3GPP TS 36.304, 5.2.4.5).
struct LteSelection {
  static constexpr int qRxLevMin = -124;
  static constexpr int qQualMin = -19;
  static constexpr int hysteresis = 3;
  static constexpr int intraSearchP = 62;
  static constexpr int nonIntraSearchP = 20;
  static constexpr int intraSearchQ = 14;
  static constexpr int nonIntraSearchQ = 6;
  static constexpr int servingLowP = 10;     // below -114 dBm lower priorities are good enough
  static constexpr int candidateHighP = 18;  // a higher priority has to reach -106 dBm
  static constexpr int candidateLowP = 14;
  static constexpr int candidateHighQ = 6;
  static constexpr int candidateLowQ = 4;
  static constexpr int maximumPower = 23;
  static constexpr Milliseconds reselectionTime = 1000;
};

// E-UTRA connected mode: event A3 between cells, A5 between carriers, B2 towards other technologies (3GPP TS 36.331,
// 5.5.4).
struct LteMobility {
  static constexpr double a3Offset = 2;
  static constexpr double hysteresis = 1;
  static constexpr Milliseconds timeToTrigger = 480;
  static constexpr double a5Serving = -109;
  static constexpr double a5Candidate = -105;
  static constexpr double b2Serving = -115;
  static constexpr double b2Umts = -106;
  static constexpr double b2Gsm = -98;
};

// E-UTRA radio link supervision (3GPP TS 36.331, 5.3.11; 36.133, 7.6).
struct LteSupervision {
  static constexpr double outOfSync = -8;
  static constexpr double inSync = -6;
  static constexpr int n310 = 2;
  static constexpr Milliseconds t310 = 1000;
  static constexpr Milliseconds t311 = 3000;
};

// C-DRX (3GPP TS 36.321, 5.7), in ms.
struct LteDrx {
  static constexpr unsigned onDuration = 10;
  static constexpr unsigned inactivity = 100;
  static constexpr unsigned retransmission = 8;
  static constexpr unsigned longCycle = 320;
  static constexpr unsigned shortCycle = 40;
  static constexpr unsigned shortCycles = 4;
};

// UTRA (3GPP TS 25.304, 5.2.6; 25.331, 14.1.2.4 for event 1D).
struct UmtsSelection {
  static constexpr int qRxLevMin = -115;
  static constexpr int qQualMin = -18;
  static constexpr int hysteresis = 4;
  static constexpr int intraSearch = 10;
  static constexpr int interSearch = 6;
  static constexpr int searchRat = 4;
  static constexpr int lteHigh = -108;  // RSRP that E-UTRA, of higher priority, has to reach
  static constexpr int servingLow = -110;
  static constexpr int gsmLow = -100;
  static constexpr Milliseconds reselectionTime = 1000;
  static constexpr Milliseconds timeToTrigger = 640;
  static constexpr Milliseconds toLteTime = 1600;
};

// GSM (3GPP TS 45.008, 6).
struct GsmSelection {
  static constexpr int rxLevAccessMin = -106;
  static constexpr int reselectHysteresis = 6;
  static constexpr int umtsHigh = -104;
  static constexpr int lteHigh = -108;
  static constexpr Milliseconds reselectionTime = 2000;
  static constexpr double handoverMargin = 5;
  static constexpr Milliseconds handoverTime = 960;
  static constexpr int maximumPower = 33;  // dBm, class 4 in the 900 MHz band
};

}  // namespace probeview::scenario
