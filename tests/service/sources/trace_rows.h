// SPDX-License-Identifier: Apache-2.0
//
// Drive-test rows of the tests' own making, in the columns of a real log.
#pragma once

#include <string>

namespace probeview {

inline const std::string traceHeader =
    "Timestamp,Longitude,Latitude,Speed,Operatorname,CellID,NetworkMode,RSRP,RSRQ,SNR,CQI,RSSI,DL_bitrate,UL_bitrate,"
    "State,PINGAVG,PINGMIN,PINGMAX,PINGSTDEV,PINGLOSS,CELLHEX,NODEHEX,LACHEX,RAWCELLID,NRxRSRP,NRxRSRQ\n";

// One row; every column that is not named holds what a log holds when it knows nothing, or something harmless.
struct TraceLine {
  std::string time = "2024.03.05_12.00.00";
  std::string mode = "LTE";
  std::string level = "-";
  std::string quality = "-";
  std::string snr = "-";
  std::string state = "-";
  std::string area = "-";
  std::string cell = "-";
  std::string neighbourLevel = "-";
  std::string neighbourQuality = "-";

  std::string text() const {
    return time + ",11.5,48.1,0,T,-," + mode + "," + level + "," + quality + "," + snr + ",-,-,0,0," + state +
           ",-,-,-,-,-,-,-," + area + "," + cell + "," + neighbourLevel + "," + neighbourQuality + "\n";
  }
};

}  // namespace probeview
