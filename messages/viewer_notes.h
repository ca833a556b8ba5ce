// SPDX-License-Identifier: Apache-2.0
//
// What the viewer makes of fields that it does not show as they are, for the rows of the messages. "On the page" alone
// means that the display dictionary keeps what came.
#pragma once

#include "messages/runtime/field_meaning.h"

namespace probeview::viewer {

inline constexpr ViewerNote localTime{"shown as text in the time zone of the device"};
inline constexpr ViewerNote entriesGetTimestamp{"each entry gets the timestamp of its message"};
inline constexpr ViewerNote pageEntriesGetTimestamp{"on the page each entry has the timestamp of its message"};
inline constexpr ViewerNote listText{"printed as a list text"};
inline constexpr ViewerNote listTextLogged{"printed as a list text, also on a log line of its own"};
inline constexpr ViewerNote dictionaryText{"printed as a dictionary text"};

// The number becomes the value for which it stands.
inline constexpr ViewerNote converted{"", true};
inline constexpr ViewerNote convertedOnPage{"on the page ", true};
inline constexpr ViewerNote convertedInSamples{"in the samples ", true};

}  // namespace probeview::viewer
