// SPDX-License-Identifier: Apache-2.0
//
// The one text form of values: log lines, cells, flattened values and tools all print through here.
//
// Dictionaries print as ["key": value, "other": "text"], lists as [1, 4], both as [] when empty. Integers are plain
// decimal; reals are the shortest decimal that reads back, in fixed notation and always with a point (1.4, 10.0); a
// 32-bit float is printed from the float. Booleans are 1 or 0. Bytes are <62f210>, <> when empty. Text inside a
// dictionary or list is quoted and escaped so that a line stays a line; text on its own stands bare. Bytes of a text
// that are not UTF-8 show as U+FFFD, one for each ill-formed sequence. Independent of the process's locale.
#pragma once

#include <string>
#include <string_view>

#include "values/dictionary.h"
#include "values/utf8.h"
#include "values/value.h"

namespace probeview {

// Appends the text form, as it stands inside a dictionary or list (text quoted).
void print(const Value& value, std::string& out);
void print(const List& list, std::string& out);
void print(const Dictionary& dictionary, std::string& out);

// The same as a new string.
std::string printed(const Value& value);
std::string printed(const List& list);
std::string printed(const Dictionary& dictionary);

// The text form of a value that stands alone, as in a cell: text bare, everything else as above.
std::string bareText(const Value& value);

// Numbers, the digits alone; shared by every text form, JSON included.
void printNumber(double number, std::string& out);
void printNumber(float number, std::string& out);
void printNumber(std::int64_t number, std::string& out);
void printNumber(std::uint64_t number, std::string& out);

// Appends two lower-case hexadecimal digits per byte.
void appendHex(std::string_view bytes, std::string& out);

}  // namespace probeview
