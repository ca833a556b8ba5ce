// SPDX-License-Identifier: Apache-2.0
#include "messages/runtime/block.h"

#include <algorithm>
#include <array>
#include <new>

#include "messages/runtime/codable.h"
#include "values/pool.h"

namespace probeview {

struct Block::Chunk {
  Chunk* next;
  std::size_t size;
};

struct Block::Destruction {
  Destruction* next;
  PBCodable* element;
};

namespace {

// Holds the largest message of the usual traffic, the files of a SIM card (40 files of 100 bytes).
constexpr std::size_t usualSize = 8192;
constexpr std::size_t largestChunk = std::size_t{1} << 20;

constexpr std::size_t keptBlocks = keepsMemory ? 4 : 0;

// What a thread keeps. Trivial, so that reaching it costs nothing; the keeper below empties it when the thread ends.
struct Kept {
  std::array<void*, keptBlocks + 1> blocks;
  std::size_t count;
  bool hasKeeper;
  bool isClosed;
};
constinit thread_local Kept kept{};

struct Keeper {
  ~Keeper() {
    kept.isClosed = true;
    while (kept.count > 0) ::operator delete(kept.blocks[--kept.count]);
  }
  void wake() noexcept { kept.hasKeeper = true; }
};
thread_local Keeper keeper;

void* takeUsual() {
  if (kept.count > 0) return kept.blocks[--kept.count];
  return ::operator new(usualSize);
}

void giveBackUsual(void* memory) noexcept {
  if (kept.count >= keptBlocks || kept.isClosed) {
    ::operator delete(memory);
    return;
  }
  if (!kept.hasKeeper) keeper.wake();
  kept.blocks[kept.count++] = memory;
}

}  // namespace

Block* Block::make() {
  auto* memory = static_cast<std::byte*>(takeUsual());
  return new (memory) Block(memory + sizeof(Block), memory + usualSize, true);
}

Block* Block::makeFor(std::size_t size) {
  size = (size + alignment - 1) & ~(alignment - 1);
  auto* memory = static_cast<std::byte*>(::operator new(sizeof(Block) + size));
  return new (memory) Block(memory + sizeof(Block), memory + sizeof(Block) + size, false);
}

void* Block::allocateSlowly(std::size_t size) {
  // Each chunk is twice the last, so that the number of allocations stays small; what is asked for is never more than
  // the bytes that have arrived call for.
  const std::size_t twice = chunks_ == nullptr ? usualSize : std::min(2 * chunks_->size, largestChunk);
  const std::size_t chunkSize = std::max(twice, sizeof(Chunk) + size);
  auto* memory = static_cast<std::byte*>(::operator new(chunkSize));
  chunks_ = new (memory) Chunk{chunks_, chunkSize};
  cursor_ = memory + sizeof(Chunk) + size;
  end_ = memory + chunkSize;
  return memory + sizeof(Chunk);
}

void Block::destroyLater(PBCodable& element) { destructions_ = new Destruction{destructions_, &element}; }

void Block::releaseContents() noexcept {
  while (destructions_ != nullptr) {
    Destruction* next = destructions_->next;
    destructions_->element->~PBCodable();
    delete destructions_;
    destructions_ = next;
  }
  while (chunks_ != nullptr) {
    Chunk* next = chunks_->next;
    ::operator delete(chunks_);
    chunks_ = next;
  }
}

void Block::rewind() noexcept {
  releaseContents();
  auto* memory = reinterpret_cast<std::byte*>(this);
  cursor_ = memory + sizeof(Block);
  end_ = isRecyclable_ ? memory + usualSize : cursor_;
}

void Block::destroy() noexcept {
  if (destructions_ != nullptr || chunks_ != nullptr) releaseContents();
  const bool isRecyclable = isRecyclable_;
  this->~Block();
  if (isRecyclable) {
    giveBackUsual(this);
  } else {
    ::operator delete(this);
  }
}

}  // namespace probeview
