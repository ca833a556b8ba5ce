// SPDX-License-Identifier: Apache-2.0
//
// The memory that a decoded message lies in. Decoding a message takes one block for all that the message owns: its
// nested messages, the tables of its lists, its bytes and texts. One count says how many hold on to anything in the
// block, so that an element can outlive the message it came with (a copy shares it) without a count of its own.
//
// Blocks of the usual size are kept by the thread that let them go and used again, so that decoding one message after
// the other allocates nothing.
//
// The count is a plain number: messages that share elements belong to one thread. A copy made by copyWithZone() shares
// nothing and may go to another.
#pragma once

#include <cstddef>
#include <cstdint>

namespace probeview {

class PBCodable;

class Block {
 public:
  // A block that grows as it is used. One reference, held by the caller.
  static Block* make();
  // A block for just one thing of that size.
  static Block* makeFor(std::size_t size);

  Block(const Block&) = delete;
  Block& operator=(const Block&) = delete;

  void retain(std::uint32_t count = 1) noexcept { references_ += count; }
  void release(std::uint32_t count = 1) noexcept {
    references_ -= count;
    if (references_ == 0) destroy();
  }
  bool isUnique() const noexcept { return references_ == 1; }

  // Memory aligned for everything in a message. It goes with the block, not before.
  void* allocate(std::size_t size) {
    size = (size + alignment - 1) & ~(alignment - 1);
    if (static_cast<std::size_t>(end_ - cursor_) < size) return allocateSlowly(size);
    void* memory = cursor_;
    cursor_ += size;
    return memory;
  }

  // Gives all memory free for use again; nothing in the block may be used any more.
  void rewind() noexcept;

  // The element, which lies in this block, has come to own memory outside it: its destructor is to run when the block
  // goes. Others need none, as all that they own goes with the block.
  void destroyLater(PBCodable& element);

 private:
  struct Chunk;
  struct Destruction;
  static constexpr std::size_t alignment = 8;

  Block(std::byte* cursor, std::byte* end, bool isRecyclable) noexcept
      : cursor_(cursor), end_(end), isRecyclable_(isRecyclable) {}
  void* allocateSlowly(std::size_t size);
  void releaseContents() noexcept;
  void destroy() noexcept;

  std::byte* cursor_;
  std::byte* end_;
  Chunk* chunks_ = nullptr;  // further memory, the newest first
  Destruction* destructions_ = nullptr;
  std::uint32_t references_ = 1;
  bool isRecyclable_;
};

}  // namespace probeview
