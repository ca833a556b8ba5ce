// SPDX-License-Identifier: Apache-2.0
//
// Values as JSON, for other programs. Integers of all 64 bits stay integers; reals have the same digits as in print();
// booleans are true and false; bytes are {"bytes":"62f210"}; a text that is not UTF-8 is {"text":"c328"}, so that
// nothing is lost. A real that is not finite is null. No blanks, no line ends: one value is always one line.
#pragma once

#include <string>
#include <string_view>

#include "values/dictionary.h"
#include "values/value.h"

namespace probeview {

void appendJson(const Value& value, std::string& out);
void appendJson(const List& list, std::string& out);
void appendJson(const Dictionary& dictionary, std::string& out);
// A JSON string; bytes that are not UTF-8 become U+FFFD. What would steer a terminal (isSteering()) stands as its
// escape.
void appendJsonString(std::string_view text, std::string& out);

}  // namespace probeview
