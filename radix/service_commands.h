// SPDX-License-Identifier: Apache-2.0
//
// Commands for those who look after the service rather than after the radio.
#pragma once

namespace radix {

// Answers with a dictionary of sources, clients, rates and losses; its keys stand in service/status_report.h.
inline constexpr char kCommandShowStatus[] = "kCommandShowStatus";
// The service's base configuration counts as that of one more client until it is cleared; the arguments are those of
// kCommandAddConfiguration.
inline constexpr char kCommandSetBaseConfiguration[] = "kCommandSetBaseConfiguration";
inline constexpr char kCommandClearBaseConfiguration[] = "kCommandClearBaseConfiguration";

}  // namespace radix
