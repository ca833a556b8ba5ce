// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <utility>

#include "scenario/phone.h"
#include "scenario/reports.h"
#include "scenario/story.h"

namespace probeview::scenario {

// A phone on its way through a world.
class PhoneStory final : public Story {
 public:
  PhoneStory(World world, std::uint64_t seed) : phone_(std::move(world), seed) {}

  void advance() override { phone_.advance(); }
  Milliseconds now() const override { return phone_.now(); }
  const Facts& facts() const override { return phone_.facts(); }
  std::vector<std::uint8_t> tell(Fact fact, std::uint64_t timestamp) override {
    return reportOf(fact).payload(phone_, timestamp);
  }

 private:
  Phone phone_;
};

}  // namespace probeview::scenario
