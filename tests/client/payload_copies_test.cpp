// SPDX-License-Identifier: Apache-2.0
//
// How often a payload is copied between the socket and the store. A copy must lie somewhere: this program looks for the
// payload in each piece of memory that it has asked for, when the piece is given back and, of those still held, in the
// end. What passes over the stack within one call is not seen. Records come twenty thousand times a second, and each
// copy was a piece of memory, too.
#include <gtest/gtest.h>
#include <sys/socket.h>

#include <array>
#include <atomic>
#include <cstdlib>
#include <cstring>
#include <memory>
#include <new>
#include <span>
#include <vector>

#include "client/radix_wrapper.h"
#include "platform/event_loop.h"
#include "radix/connection_manager.h"
#include "radix/socket_link.h"
#include "store/metric_validator.h"

namespace {

// Stands before each piece of memory.
struct alignas(std::max_align_t) Piece {
  Piece* previous;
  Piece* next;
  std::size_t size;
};

// What is looked for, in memory that is not counted, and in how many pieces it was found that have been given back.
// Nothing of this may need a constructor: memory is asked for before there are any.
struct Search {
  const std::uint8_t* payload;
  std::size_t size;
  std::size_t found;
};
constinit Search search{};
constinit Piece pieces{&pieces, &pieces, 0};
constinit std::atomic_flag isBusy = ATOMIC_FLAG_INIT;

class Turn {
 public:
  Turn() noexcept {
    while (isBusy.test_and_set(std::memory_order_acquire)) {
    }
  }
  ~Turn() { isBusy.clear(std::memory_order_release); }
};

bool holdsPayload(const Piece& piece) noexcept {
  return search.size != 0 && ::memmem(&piece + 1, piece.size, search.payload, search.size) != nullptr;
}

// In how many pieces of memory the payload lies or has lain.
std::size_t placesOfPayload() noexcept {
  const Turn turn;
  std::size_t count = search.found;
  for (const Piece* piece = pieces.next; piece != &pieces; piece = piece->next) count += holdsPayload(*piece) ? 1 : 0;
  return count;
}

}  // namespace

void* operator new(std::size_t size) {
  // Cleared, so that nothing is found in it that lay there before.
  auto* piece = static_cast<Piece*>(std::calloc(1, sizeof(Piece) + size));
  if (piece == nullptr) throw std::bad_alloc();
  const Turn turn;
  *piece = {&pieces, pieces.next, size};
  pieces.next->previous = piece;
  pieces.next = piece;
  return piece + 1;
}

void operator delete(void* memory) noexcept {
  if (memory == nullptr) return;
  Piece* piece = static_cast<Piece*>(memory) - 1;
  {
    const Turn turn;
    if (holdsPayload(*piece)) ++search.found;
    piece->previous->next = piece->next;
    piece->next->previous = piece->previous;
  }
  std::free(piece);
}
void operator delete(void* memory, std::size_t) noexcept { operator delete(memory); }

namespace probeview {
namespace {

// Bytes that no heap sees.
class Written {
 public:
  void add(std::initializer_list<std::uint8_t> bytes) {
    for (const std::uint8_t byte : bytes) bytes_.at(size_++) = byte;
  }
  void addVarint(std::size_t number) {
    for (; number >= 0x80; number >>= 7) add({static_cast<std::uint8_t>(0x80 | (number & 0x7F))});
    add({static_cast<std::uint8_t>(number)});
  }
  void add(const Written& other) {
    for (std::size_t index = 0; index < other.size_; ++index) add({other.bytes_[index]});
  }
  std::span<const std::uint8_t> bytes() const { return {bytes_.data(), size_}; }
  std::size_t size() const { return size_; }

 private:
  std::array<std::uint8_t, 100'000> bytes_{};
  std::size_t size_ = 0;
};

// An RRC state, and behind it so many bytes in a field that nobody knows.
void writePayload(std::size_t more, Written& payload) {
  payload.add({0x08, 0x01, 0x10, 0x03, 0xA2, 0x1F});
  payload.addVarint(more);
  for (std::size_t index = 0; index < more; ++index) payload.add({static_cast<std::uint8_t>(index * index + 7)});
}

// A metric's event, as it stands in its frame.
void writeEvent(const Written& payload, Written& frame) {
  static Written event;
  event = Written();
  event.add({0x08, 0x00, 0x10, 0x84, 0x9C, 0xF1, 0x01, 0x1A});
  event.addVarint(payload.size());
  event.add(payload);
  event.add({0x28, 0x05, 0x32, 0x01, 'o'});
  frame.add({0x2A});
  frame.addVarint(event.size());
  frame.add(event);
}

class SocketPairConnector final : public radix::Connector {
 public:
  SocketPairConnector(EventLoop& loop, FileDescriptor near) : loop_(loop), near_(std::move(near)) {}
  radix::ConnectResult connect() override {
    if (near_.number() < 0) return {nullptr, false, "nobody is there"};
    return {radix::makeSocketLink(loop_, std::move(near_)), false, {}};
  }

 private:
  EventLoop& loop_;
  FileDescriptor near_;
};

class CountingStore final : public MetricValidator {
 public:
  using MetricValidator::MetricValidator;
  void metricsDidUpdate(const Dictionary* event) override {
    MetricValidator::metricsDidUpdate(event);
    ++records;
  }
  int records = 0;
};

// The places of a payload of that size in this process, that into which the system received it not counted.
std::size_t copiesOnTheWayIntoTheStore(std::size_t more) {
  static Written payload;
  static Written frame;
  payload = Written();
  frame = Written();
  writePayload(more, payload);
  writeEvent(payload, frame);

  int ends[2];
  if (::socketpair(AF_UNIX, SOCK_SEQPACKET | SOCK_CLOEXEC, 0, ends) != 0) throw std::runtime_error("no sockets");
  const FileDescriptor service(ends[0]);
  EventLoop loop;
  DiscardingSink nowhere;
  std::size_t copies = 0;
  {
    RadixWrapper wrapper(
        radix::client::makeConnectionManager(loop, std::make_unique<SocketPairConnector>(loop, FileDescriptor(ends[1])),
                                             {.clientName = "viewer"}, {std::shared_ptr<void>(), &loop}),
        {.mainQueue = loop, .systemLog = nowhere});
    CountingStore store({.wrapper = &wrapper, .console = nowhere, .systemLog = nowhere});
    const auto receive = [&](std::span<const std::uint8_t> bytes, auto condition) {
      EXPECT_EQ(::send(service.number(), bytes.data(), bytes.size(), 0), static_cast<ssize_t>(bytes.size()));
      EXPECT_TRUE(loop.runUntil(condition, std::chrono::seconds(20)));
    };
    const std::array<std::uint8_t, 6> hello{0x0A, 0x04, 0x08, 0x01, 0x10, 0x01};
    receive(hello, [&] { return wrapper.serviceStatus().connection.connected; });
    search = {payload.bytes().data(), payload.size(), 0};
    receive(frame.bytes(), [&] { return store.records == 1; });
    EXPECT_TRUE(store.myLTERRCStateDict().has_value());
    copies = placesOfPayload() - 1;
  }
  loop.runUntil([] { return true; }, {});
  search = {};
  return copies;
}

// Larger than any memory that is kept for use again, so that no two copies can lie in the same place.
TEST(PayloadCopies, ALargePayloadIsCopiedTwiceAtMostBetweenTheSocketAndTheStore) {
  EXPECT_LE(copiesOnTheWayIntoTheStore(10'000), 2U);
}

// One that lies within a value: whoever copies the dictionary copies it, too.
TEST(PayloadCopies, ASmallPayloadIsCopiedTwiceAtMostBetweenTheSocketAndTheStore) {
  EXPECT_LE(copiesOnTheWayIntoTheStore(20), 2U);
}

TEST(PayloadCopies, TheUsualPayloadIsCopiedTwiceAtMostBetweenTheSocketAndTheStore) {
  EXPECT_LE(copiesOnTheWayIntoTheStore(100), 2U);
}

// The search itself: a copy that somebody made and gave back is seen.
TEST(PayloadCopies, ACopyIsFoundAlsoWhenItsMemoryHasBeenGivenBack) {
  static const std::array<std::uint8_t, 8> sought{9, 8, 7, 6, 5, 4, 3, 2};
  search = {sought.data(), sought.size(), 0};
  const auto held = std::make_unique<std::array<std::uint8_t, 20>>();
  std::memcpy(held->data() + 3, sought.data(), sought.size());
  { const std::vector<std::uint8_t> gone(sought.begin(), sought.end()); }
  EXPECT_EQ(placesOfPayload(), 2U);
  search = {};
}

}  // namespace
}  // namespace probeview
