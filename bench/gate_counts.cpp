// SPDX-License-Identifier: Apache-2.0
//
// gate_counts   what bench/gate watches: decode, encode and print of the flat message (a) and of the mixed stream (f),
//               counted under callgrind. Without the peers, so that it is built fast.
#include <iostream>

#include "bench/count.h"

int main() {
  using namespace probeview::bench;
  for (const Contender& contender : ourContenders()) {
    if (contender.name != "ours") continue;
    for (const char* set : {"a", "f"}) countCase(contender, payloadSet(set), std::cout);
  }
  return 0;
}
