// SPDX-License-Identifier: Apache-2.0
//
// The four records that the metric store keeps beside its display dictionaries. Value types; the pages read copies.
// Every list starts as one placeholder entry; a list is replaced only by a metric that carries its source list.
#pragma once

#include "values/dictionary.h"

namespace probeview {

// An entry whose only key and whose value are both "Waiting for Update".
Dictionary placeholderEntry();
// A list of one placeholder entry.
List placeholderList();

// Pages and tools name them as they have always been named.
// NOLINTBEGIN(readability-identifier-naming)
struct LTE {
  LTE();

  Dictionary SelReselCellInfo;  // twenty fixed keys
  List EutraNbrs;
  // No handler writes these: the matching metrics rewrite only their own display dictionaries.
  List RsrpRsrqSinr;
  List TxPower;
  List EutraNbrsMeas;
  List UtraNbrsMeas;
  List GeraNbrsMeas;
  List CAStatusList;
  List MMCommonInfo;
  Value IMSI;  // text
};

struct UMTS {
  UMTS();

  List rXInfo;
  List TxPower;
  Dictionary SelReselCellInfo;  // fourteen fixed keys
  List eUtraNbrs;
  List utraNbrs;
  List geraNbrs;
  List eUtraNbrMeas;
  List utraNbrMeas;
  List geraNbrMeas;
};

// NOLINTEND(readability-identifier-naming)

struct GSM {
  GSM();

  List eUtraNbrMeas;
  List utraNbrMeas;
  List geraNbrMeas;
};

struct Common {
  Common();

  List activeBearer;
  List simContents;
};

}  // namespace probeview
