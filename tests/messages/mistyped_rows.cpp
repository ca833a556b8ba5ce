// SPDX-License-Identifier: Apache-2.0
//
// Rows whose names disagree, one for each test that asks the compiler to refuse it; without any it compiles.
#include "messages/runtime/field_table.h"

namespace probeview {

// clang-format off

class Mistyped final : public PBCodable {
  PB_MESSAGE(Mistyped)
  PB_FIELD(1, "Idle_rxlev_dBm",  idleRxlevDBm, IdleRxlevDBm, sint32);
  PB_LIST (2, "rx_info",         rxInfos,      RxInfos, rxInfo, RxInfo, repeated<message<Mistyped>>);
  PB_VALUES(3, "cs_tx_pwr",      csTxPwr,      CsTxPwr, csTxPwr, CsTxPwr, repeated<sint32>);
#if defined(ACCESSOR)
  PB_FIELD(4, "prev_state",      prevState,    PrevStaet,    uint32);
#elif defined(KEY)
  PB_FIELD(4, "prev_staet",      prevState,    PrevState,    uint32);
#elif defined(ELEMENT)
  PB_LIST(4, "scc_list",         sccLists,     SccLists, sccList, ScList, repeated<message<Mistyped>>);
#elif defined(NUMBER)
  PB_FIELD(1, "state",           state,        State,        uint32);
#endif
};

// clang-format on

}  // namespace probeview
