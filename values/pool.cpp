// SPDX-License-Identifier: Apache-2.0
#include "values/pool.h"

#include <array>
#include <new>
#include <utility>

namespace probeview {

namespace {

constexpr std::size_t stepSize = 64;
constexpr std::size_t shelfCount = 32;
// How many bytes a thread keeps: enough for the dictionaries of the largest message.
constexpr std::size_t mostKept = keepsMemory ? std::size_t{256} << 10 : 0;

// A piece that is kept begins with a pointer to the next one of its size.
struct Piece {
  Piece* next;
};

// Trivial, so that reaching it costs nothing; the keeper below empties it when the thread ends.
struct Shelves {
  std::array<Piece*, shelfCount> bySize;  // of one step, of two, …
  std::size_t room;                       // how many bytes more may be kept; none until there is a keeper
  bool hasKeeper;
};
constinit thread_local Shelves shelves{};

struct Keeper {
  Keeper() noexcept {
    shelves.room = mostKept;
    shelves.hasKeeper = true;
  }
  // What is given back after this is not kept any more.
  ~Keeper() {
    shelves.room = 0;
    for (Piece*& first : shelves.bySize) {
      while (first != nullptr) ::operator delete(std::exchange(first, first->next));
    }
  }
  void wake() const noexcept {}
};
thread_local const Keeper keeper;

// 0 for up to one step, 1 for up to two; beyond the shelves for what is larger, and for nothing at all.
std::size_t shelfOf(std::size_t size) noexcept { return (size - 1) / stepSize; }

[[gnu::noinline]] void* takeNewMemory(std::size_t size) {
  return ::operator new(shelfOf(size) < shelfCount ? (shelfOf(size) + 1) * stepSize : size);
}

[[gnu::noinline]] void letMemoryGo(void* memory, std::size_t size) noexcept {
  if (shelves.hasKeeper) return ::operator delete(memory);
  keeper.wake();
  giveMemoryBack(memory, size);
}

}  // namespace

void* takeMemory(std::size_t size) {
  const std::size_t shelf = shelfOf(size);
  if (shelf >= shelfCount || shelves.bySize[shelf] == nullptr) return takeNewMemory(size);
  Piece* piece = shelves.bySize[shelf];
  shelves.bySize[shelf] = piece->next;
  shelves.room += (shelf + 1) * stepSize;
  return piece;
}

void giveMemoryBack(void* memory, std::size_t size) noexcept {
  const std::size_t shelf = shelfOf(size);
  const std::size_t kept = (shelf + 1) * stepSize;
  if (shelf >= shelfCount || shelves.room < kept) return letMemoryGo(memory, size);
  shelves.room -= kept;
  shelves.bySize[shelf] = new (memory) Piece{shelves.bySize[shelf]};
}

}  // namespace probeview
