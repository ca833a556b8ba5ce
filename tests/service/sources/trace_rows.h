// SPDX-License-Identifier: Apache-2.0
//
// Drive-test rows of the tests' own making, in the columns of a real log.
#pragma once

#include <cstdint>
#include <optional>
#include <string>

#include "values/plain_text.h"

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
  // CELLHEX and NODEHEX; what a logger writes beside that cell, unless told.
  std::optional<std::string> cellPart = {};
  std::optional<std::string> nodePart = {};

  std::string text() const {
    return time + ",11.5,48.1,0,T,-," + mode + "," + level + "," + quality + "," + snr + ",-,-,0,0," + state +
           ",-,-,-,-,-," + cellPart.value_or(usualCellPart()) + "," + nodePart.value_or(usualNodePart()) + "," + area +
           "," + cell + "," + neighbourLevel + "," + neighbourQuality + "\n";
  }

 private:
  bool isLte() const { return mode == "LTE" || mode == "5G"; }
  bool isGsm() const { return mode == "GSM" || mode == "GPRS" || mode == "EDGE"; }
  std::int64_t cellsOfNode() const { return isLte() ? 0x100 : 0x10000; }
  // The digits alone, as loggers write them.
  static std::string hexDigits(std::int64_t number) { return hexText(number).substr(2); }

  std::string usualCellPart() const {
    const auto identity = parseInteger64(cell);
    if (!identity) return "-";
    return hexDigits(isGsm() ? *identity : *identity % cellsOfNode());
  }
  std::string usualNodePart() const {
    const auto identity = parseInteger64(cell);
    return identity && !isGsm() ? hexDigits(*identity / cellsOfNode()) : "-";
  }
};

}  // namespace probeview
