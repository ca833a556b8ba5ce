// SPDX-License-Identifier: Apache-2.0
//
// What decides when times do not: how many instructions and how many allocations a case takes.
#pragma once

#include <ostream>
#include <string>

#include "bench/case.h"

namespace probeview::bench {

std::string_view nameOf(Task task);

// Per message.
double allocationsOf(Case& test, const PayloadSet& set);

// Under callgrind, started with --collect-atstart=no: the instructions as one dump of the name
// "task/contender/set"; and on the stream that name, how many messages they were for, and the allocations per message.
void countCase(const Contender& contender, const PayloadSet& set, std::ostream& out);

}  // namespace probeview::bench
