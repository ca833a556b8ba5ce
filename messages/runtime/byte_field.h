// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <string_view>

namespace probeview {

class Block;

// The bytes or the text of one field; absent or present, and present even when empty. Texts keep their bytes as they
// came, UTF-8 or not.
class PBByteField {
 public:
  PBByteField() noexcept = default;
  PBByteField(const PBByteField&) = delete;
  PBByteField& operator=(const PBByteField&) = delete;
  PBByteField(PBByteField&& other) noexcept;
  PBByteField& operator=(PBByteField&& other) noexcept;
  ~PBByteField() { clear(); }

  bool isPresent() const noexcept { return data_ != nullptr; }
  // Empty when absent. Valid until the field changes.
  std::span<const std::uint8_t> bytes() const noexcept { return {data_, size_}; }
  std::string_view text() const noexcept { return {reinterpret_cast<const char*>(data_), size_}; }

  // Copies the bytes, into memory of their own.
  void set(std::span<const std::uint8_t> bytes);
  // Copies the bytes into the block, which must outlive them.
  void set(std::span<const std::uint8_t> bytes, Block& block);
  void clear() noexcept;
  bool ownsMemory() const noexcept { return ownsMemory_; }

 private:
  const std::uint8_t* data_ = nullptr;
  std::uint32_t size_ = 0;
  bool ownsMemory_ = false;
};

}  // namespace probeview
