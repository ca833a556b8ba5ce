// SPDX-License-Identifier: Apache-2.0
#include "values/pool.h"

#include <array>
#include <cstdint>
#include <new>

namespace probeview {

namespace {

constexpr std::size_t step = 64;
constexpr std::size_t largest = 2048;

constexpr std::uint32_t keptOfEach = keepsMemory ? 64 : 0;

struct Piece {
  Piece* next;
};

struct Shelf {
  Piece* first;
  std::uint32_t count;
};

// Trivial, so that reaching it costs nothing; the keeper below empties it when the thread ends.
struct Shelves {
  std::array<Shelf, largest / step> bySize;
  bool hasKeeper;
  bool isClosed;
};
constinit thread_local Shelves shelves{};

struct Keeper {
  ~Keeper() {
    shelves.isClosed = true;
    for (Shelf& shelf : shelves.bySize) {
      while (shelf.first != nullptr) {
        Piece* next = shelf.first->next;
        ::operator delete(shelf.first);
        shelf.first = next;
      }
    }
  }
  void wake() noexcept { shelves.hasKeeper = true; }
};
thread_local Keeper keeper;

}  // namespace

void* takeMemory(std::size_t size) {
  if (size == 0 || size > largest) return ::operator new(size);
  Shelf& shelf = shelves.bySize[(size - 1) / step];
  if (shelf.first == nullptr) return ::operator new((size + step - 1) / step * step);
  Piece* piece = shelf.first;
  shelf.first = piece->next;
  --shelf.count;
  return piece;
}

void giveMemoryBack(void* memory, std::size_t size) noexcept {
  if (size == 0 || size > largest || shelves.isClosed) return ::operator delete(memory);
  Shelf& shelf = shelves.bySize[(size - 1) / step];
  if (shelf.count >= keptOfEach) return ::operator delete(memory);
  if (!shelves.hasKeeper) keeper.wake();
  shelf.first = new (memory) Piece{shelf.first};
  ++shelf.count;
}

}  // namespace probeview
