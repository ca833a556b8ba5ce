// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <span>
#include <string_view>

#include "messages/runtime/block.h"

namespace probeview {

// The bytes or the text of one field; absent or present, and present even when empty. Texts keep their bytes as they
// came, UTF-8 or not.
class PBByteField {
 public:
  PBByteField() noexcept = default;
  PBByteField(const PBByteField&) = delete;
  PBByteField& operator=(const PBByteField&) = delete;
  PBByteField(PBByteField&& other) noexcept;
  PBByteField& operator=(PBByteField&& other) noexcept;
  ~PBByteField() {
    if (ownsMemory_) clear();
  }

  bool isPresent() const noexcept { return data_ != nullptr; }
  // Empty when absent. Valid until the field changes.
  std::span<const std::uint8_t> bytes() const noexcept { return {data_, size_}; }
  std::string_view text() const noexcept { return {reinterpret_cast<const char*>(data_), size_}; }

  // Copies the bytes, into memory of their own.
  void set(std::span<const std::uint8_t> bytes);
  // Copies the bytes into the block, which must outlive them.
  void set(std::span<const std::uint8_t> bytes, Block& block) {
    auto* copy = static_cast<std::uint8_t*>(block.allocate(bytes.size()));
    if (!bytes.empty()) std::memcpy(copy, bytes.data(), bytes.size());
    setLocal({copy, bytes.size()});
  }
  // The bytes lie, even if they are none, in a block that outlives them.
  void setLocal(std::span<const std::uint8_t> bytes) {
    if (bytes.size() > longest) throwTooLong();
    if (ownsMemory_) clear();
    data_ = bytes.data();
    size_ = static_cast<std::uint32_t>(bytes.size());
  }
  void clear() noexcept;
  bool ownsMemory() const noexcept { return ownsMemory_; }

 private:
  static constexpr std::size_t longest = 0xFFFFFFFF;
  // Where the bytes of an empty field lie: present is what has an address.
  static constexpr std::uint8_t noBytes[1] = {};
  [[noreturn]] static void throwTooLong();

  const std::uint8_t* data_ = nullptr;
  std::uint32_t size_ = 0;
  bool ownsMemory_ = false;
};

}  // namespace probeview
