// SPDX-License-Identifier: Apache-2.0
//
// The one quiet line below the list, as a front draws it.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

namespace probeview {

struct Status {
  // How the page stands. Each kind has a look of its own: a mark, and where something is amiss a colour as well.
  enum class Kind : std::uint8_t {
    Live,        // its values come, or would if they changed
    Waiting,     // nothing has come yet, but may
    Unfillable,  // nothing can come: nobody fills it
    Stale,       // what should have come has not
    Ended,       // its source has told all that it had
    Failed,      // its source has failed, or the configuration was not taken
    Away,        // the service is not there
  };

  Kind kind = Kind::Live;
  // One line of valid UTF-8 without control characters. It says in words what mark and colour say.
  std::string text;

  friend bool operator==(const Status&, const Status&) = default;
};

// Their names, in the order of the enumeration.
inline constexpr std::array<std::string_view, 7> statusKindNames = {"live",  "waiting", "unfillable", "stale",
                                                                    "ended", "failed",  "away"};

constexpr std::string_view statusKindName(Status::Kind kind) { return statusKindNames[static_cast<std::size_t>(kind)]; }

}  // namespace probeview
