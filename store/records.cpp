// SPDX-License-Identifier: Apache-2.0
#include "store/records.h"

#include <initializer_list>

namespace probeview {

namespace {

// The keys in their order, each with an empty text.
Dictionary blankEntry(std::initializer_list<Key> keys) {
  Dictionary blank;
  blank.reserve(keys.size());
  for (const Key& key : keys) blank.append(key, Value());
  return blank;
}

}  // namespace

Dictionary placeholderEntry() { return {{"Waiting for Update", Value::constant("Waiting for Update")}}; }

List placeholderList() { return {placeholderEntry()}; }

LTE::LTE()
    : SelReselCellInfo(blankEntry({
          "timestamp",
          "ims_emergency_support",
          "ac_barring_for_emergency",
          "mo_signalling_ac_barring_factor",
          "mo_signalling_ac_barring_time",
          "mo_signalling_ac_barring_for_special_ac",
          "mo_data_ac_barring_factor",
          "mo_data_ac_barring_time",
          "mo_data_ac_barring_for_special_ac",
          "QRxLevMin",
          "QQualMin",
          "Q_hyst",
          "S_non_intra_search_P",
          "S_non_intra_search_Q",
          "S_intra_search_P",
          "S_intra_search_Q",
          "Thresh_serving_lowP",
          "Thresh_serving_lowQ",
          "priority_operating_freq",
          "multi_band_info",
      })),
      EutraNbrs(placeholderList()),
      RsrpRsrqSinr(placeholderList()),
      TxPower(placeholderList()),
      EutraNbrsMeas(placeholderList()),
      UtraNbrsMeas(placeholderList()),
      GeraNbrsMeas(placeholderList()),
      CAStatusList(placeholderList()),
      MMCommonInfo(placeholderList()),
      IMSI(Value::constant("Come Back Later")) {}

UMTS::UMTS()
    : rXInfo(placeholderList()),
      TxPower(placeholderList()),
      SelReselCellInfo(blankEntry({
          "timestamp",
          "ims_emergency_support",
          "hsdpa_capable",
          "edch_capable",
          "duplex_mode",
          "cell_barred",
          "fach_meas_occ_info_present",
          "s_rxlev",
          "s_qual",
          "s_intrasearch",
          "s_intersearch",
          "s_search_rat",
          "s_cell_prio",
          "multi_band_info",
      })),
      eUtraNbrs(placeholderList()),
      utraNbrs(placeholderList()),
      geraNbrs(placeholderList()),
      eUtraNbrMeas(placeholderList()),
      utraNbrMeas(placeholderList()),
      geraNbrMeas(placeholderList()) {}

GSM::GSM() : eUtraNbrMeas(placeholderList()), utraNbrMeas(placeholderList()), geraNbrMeas(placeholderList()) {}

Common::Common() : activeBearer(placeholderList()), simContents(placeholderList()) {}

}  // namespace probeview
