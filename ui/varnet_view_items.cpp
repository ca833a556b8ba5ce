// SPDX-License-Identifier: Apache-2.0
#include "ui/varnet_view_items.h"

namespace probeview {

VarnetViewItems::VarnetViewItems()
    : launchViewItemNames{"Device Info", "LTE", "UMTS", "GSM"},
      firstLevelViewItems{
          {"Device Info",
           {
               "IMSI",
               "IMEISV",
               "SIM Files",
           }},
          {"LTE",
           {
               "NAS",
               "RRC State",
               "Serving Cell Info",
               "Serving Cell Meas",
               "Tx Power",
               "Sel Resel Parameters",
               "EUTRA Neighbor Info",
               "C-DRX",
               "LTE Neighbor Cell Meas",
               "UMTS Neighbor Cell Meas",
               "GSM Neighbor Cell Meas",
               "CA Status",
               "Active Bearers",
           }},
          {"UMTS",
           {
               "NAS GMM",
               "NAS MM",
               "RRC State",
               "RRC Configuration",
               "Serving Cell Info",
               "Serving Cell Meas",
               "Tx Power",
               "Sel Resel Parameters",
               "EUTRA Neighbor Info",
               "UTRA Neighbor Info",
               "GSM Neighbor Info",
               "LTE Neighbor Cell Meas",
               "UMTS Neighbor Cell Meas",
               "GSM Neighbor Cell Meas",
               "Active Bearers",
           }},
          {"GSM",
           {
               "NAS GMM",
               "NAS MM",
               "Serving Cell Info",
               "Idle Config",
               "Idle Serv Cell Meas",
               "Connected Serv Cell Meas",
               "GSM GPRS Config",
               "LTE Neighbor Cell Meas",
               "UMTS Neighbor Cell Meas",
               "GSM Neighbor Cell Meas",
               "Active Bearers",
           }},
      } {}

const VarnetViewItems& launchViewItems() {
  static const auto* items = new VarnetViewItems;
  return *items;
}

std::string pageKey(const std::string& technology, const std::string& category) { return technology + " " + category; }

std::vector<std::string> navigablePageKeys() {
  const auto& items = launchViewItems();
  std::vector<std::string> keys;
  for (const auto& technology : items.launchViewItemNames) {
    for (const auto& category : items.firstLevelViewItems.at(technology)) keys.push_back(pageKey(technology, category));
  }
  return keys;
}

}  // namespace probeview
