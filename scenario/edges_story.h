// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <array>
#include <vector>

#include "messages/runtime/field_descriptor.h"
#include "scenario/facts.h"
#include "scenario/story.h"

namespace probeview::scenario {

// One after the other, what each metric can carry at its edges: every field, no list and long lists, every name of
// every enumeration and a number beyond, smallest and largest numbers, texts that want escaping. No phone could tell
// this; it is there so that each row that a page can show is seen. Everything decodes, and nothing overflows what a
// reader computes from it.
class EdgesStory final : public Story {
 public:
  void advance() override;
  Milliseconds now() const override { return now_; }
  const Facts& facts() const override { return facts_; }
  // Each time the next variant.
  std::vector<std::uint8_t> tell(Fact fact, std::uint64_t timestamp) override;

  // How often there is something new to tell.
  static constexpr Milliseconds newsTime = 400;
  // How many variants a message has before they begin anew.
  static std::size_t variants(const MessageDescriptor& message);
  static std::vector<std::uint8_t> variant(const MessageDescriptor& message, std::size_t number,
                                           std::uint64_t timestamp);

 private:
  Milliseconds now_ = -stepTime;
  Facts facts_;
  std::array<std::size_t, factCount> told_{};
};

}  // namespace probeview::scenario
