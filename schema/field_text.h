// SPDX-License-Identifier: Apache-2.0
//
// What the rows of the messages say, in words: for the published pages and `probectl metrics`.
#pragma once

#include <string>
#include <string_view>

#include "messages/runtime/field_descriptor.h"

namespace probeview {

// "Reported RSRP, 0 to 97 for -140 to -44 dBm, dBm = number - 140 (3GPP TS 36.133, 9.1.4)".
std::string meaningText(const MessageDescriptor& message, const FieldDescriptor& field);

// What the viewer makes of the field, "on the page in dBm"; empty when it shows it as it is.
std::string viewerText(const MessageDescriptor& message, const FieldDescriptor& field);

// "0 to 97", "0 or 1", "28 bits"; empty when any number may come. An unsigned field has no numbers below 0.
std::string numbersText(const Quantity& quantity, bool isUnsigned = false);

// "dBm = number - 140", "index for 1.4, 3, 5, 10, 15, 20 MHz"; empty where the number is the value.
std::string conversionText(const Quantity& quantity);

// "19.5", with no more digits than it needs.
std::string plainNumber(double value);

// The display dictionary of the store that holds the latest message of that class; empty when there is none.
std::string_view displayDictionaryOf(const MessageDescriptor& message);

}  // namespace probeview
