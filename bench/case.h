// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "bench/payloads.h"

namespace probeview::bench {

// One thing that one peer does to one set of payloads.
class Case {
 public:
  virtual ~Case() = default;
  // Does it once to every payload of the set.
  virtual void run() = 0;
  // What came out for the first payload, so that all peers can be seen to have done the same work.
  virtual std::string result() { return {}; }
};

enum class Task { Decode, Encode, Print };

struct Contender {
  std::string_view name;  // "ours", "libprotobuf reused", …
  Task task;
  std::unique_ptr<Case> (*make)(const PayloadSet& set);
};

std::vector<Contender> ourContenders();
std::vector<Contender> unpredictedContenders();
std::vector<Contender> libprotobufContenders();
std::vector<Contender> protozeroContenders();
std::vector<Contender> nanopbContenders();
std::vector<Contender> allContenders();

// Calls one function per payload, chosen by the payload's class beforehand.
template <typename Function>
struct Step {
  Function function;
  const Payload* payload;
};

// The result is used: the compiler must not drop what made it.
template <typename Type>
inline void keep(const Type& value) {
  asm volatile("" : : "r"(&value) : "memory");
}

}  // namespace probeview::bench
