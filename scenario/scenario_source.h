// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string_view>

#include "source/metric_source.h"

namespace probeview {

// A deterministic drive through a made-up network: "[NAME][,seed=N][,speed=N]", what follows "scenario:" on a command
// line (the colon itself may be there too). Without a name it is the city.
//
//   city      around some blocks of a town: handovers, an underpass with UMTS only, a ravine with GSM only
//   highway   sixty kilometres there and back: fast handovers, losses of coverage
//   indoor    about a building on foot: weak UMTS and GSM
//   soak      the city, every metric twenty times a second whatever was asked for
//   edges     no drive: each metric with all that it can carry, one variant after the other
//
// The seed, 0 to 2^64 - 1 and 1 unless told, decides about shadows, numbers and what the phone's owner does: same seed,
// same records. The speed, 1 to 1000, makes the drive go faster; how often something is reported stays as it was asked.
//
// The drive begins when somebody first listens, with the phone being switched on: in its first two seconds it looks
// through GSM, UMTS and LTE, so that each metric is reported once. While nobody listens it rests, without timers, and
// goes on from there; while somebody listens who wants nothing there is no timer either, and a question or a new wish
// is answered as if the drive had gone on, for a few seconds at least. Records carry the time of day at which listening
// began plus the simulated time since then; when the clock is set, they follow it.
SourceResult makeScenarioSource(std::string_view arguments);

}  // namespace probeview
