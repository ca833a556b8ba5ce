// SPDX-License-Identifier: Apache-2.0
#include "platform/log_writer.h"

#include <poll.h>
#include <pthread.h>
#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <cerrno>
#include <condition_variable>
#include <csignal>
#include <cstdlib>
#include <deque>
#include <mutex>
#include <system_error>
#include <thread>
#include <utility>
#include <vector>

#include "platform/threads.h"

namespace probeview {

namespace {

using SteadyClock = std::chrono::steady_clock;
using std::chrono::nanoseconds;

// What waits is kept in blocks of this size, which go when they are written: a log that rests holds nothing.
constexpr std::size_t blockBytes = 64 * 1024;
constexpr std::size_t entriesPerBlock = blockBytes / 16;
constexpr std::size_t blockOverhead = entriesPerBlock * sizeof(std::uint32_t);
// A pipe takes so many bytes in one piece, however many processes write to it (PIPE_BUF).
constexpr std::size_t pieceBytes = 4096;
// What a reader takes to earn a caller's patience anew.
constexpr std::int64_t patientBytes = 64 * 1024;
// How long the thread lets lines gather after it has written some, so that a stream of them does not wake it for each.
constexpr std::chrono::milliseconds gatheringTime{2};

// Counts the forks that led to this process: the threads of the one before are not here.
std::atomic<int> forks{0};

}  // namespace

struct LogWriter::State {
  struct Block {
    explicit Block(std::size_t bytes) : cost(bytes + blockOverhead) {
      text.reserve(bytes);
      ends.reserve(entriesPerBlock);
    }
    bool takes(std::size_t size) const {
      return ends.size() < entriesPerBlock && text.size() + size <= text.capacity();
    }

    std::size_t cost;
    std::string text;
    std::vector<std::uint32_t> ends;  // of each entry in the text
  };

  State(Settings chosen, Output where)
      : settings(std::move(chosen)), output(std::move(where)), patience(settings.patience) {}

  const Settings settings;
  const Output output;
  const int forksBefore = forks.load();
  std::atomic<bool> closed = false;
  std::atomic<bool> abandoned = false;  // nobody waits for what is left; the descriptor may be gone

  std::mutex mutex;
  std::condition_variable work;      // the thread waits for it
  std::condition_variable progress;  // callers wait for it
  std::deque<Block> blocks;
  std::size_t held = 0;  // the cost of all blocks, of the one that is being written, too
  std::uint64_t lost = 0;
  nanoseconds patience;
  bool dropping = false;
  bool writing = false;
  bool idle = false;
  bool ending = false;
  int hurries = 0;  // callers that wait for the end
  std::thread thread;

  bool isOfAnotherProcess() const { return forks.load(std::memory_order_relaxed) != forksBefore; }

  // All below with the lock.
  bool isWritten() const { return closed || (blocks.empty() && !writing && lost == 0); }

  static std::size_t blockFor(std::size_t size) { return std::max(size, blockBytes); }

  bool hasRoom(std::size_t size) const {
    if (held == 0 || closed || (!blocks.empty() && blocks.back().takes(size))) return true;
    return held + blockFor(size) + blockOverhead <= settings.mostBytes;
  }

  bool waitForRoom(std::unique_lock<std::mutex>& lock, std::size_t size) {
    while (!hasRoom(size)) {
      if (settings.patience == unlimitedPatience) {
        progress.wait(lock);
        continue;
      }
      if (patience <= nanoseconds::zero()) return false;
      const auto begin = SteadyClock::now();
      progress.wait_for(lock, patience);
      patience -= SteadyClock::now() - begin;
    }
    return true;
  }

  void keep(std::string_view entry) {
    if (blocks.empty() || !blocks.back().takes(entry.size())) {
      blocks.emplace_back(blockFor(entry.size()));
      held += blocks.back().cost;
    }
    Block& block = blocks.back();
    block.text += entry;
    block.ends.push_back(static_cast<std::uint32_t>(block.text.size()));
  }

  void tellLoss() {
    if (lost == 0) return;
    std::string line = settings.prefix + std::to_string(lost) + (lost == 1 ? " line was" : " lines were") +
                       " left out here, as the log was not taken away fast enough";
    if (settings.gathers) line += '\n';
    lost = 0;
    keep(line);
  }

  void lose(std::string_view entry) {
    const auto lineEnds = std::count(entry.begin(), entry.end(), '\n');
    lost += settings.gathers ? static_cast<std::uint64_t>(lineEnds) : 1;
  }

  // Once, however many lines come until it is awake.
  void wakeThread() {
    if (std::exchange(idle, false) || blocks.size() > 1) work.notify_one();
  }

  // On the thread, without the lock. False when nobody takes anything any more.
  bool put(std::string_view text, bool& isLost) {
    const Outcome outcome = output(text);
    isLost = outcome == Outcome::Lost;
    if (outcome == Outcome::Closed) return false;
    if (settings.patience != nanoseconds::zero() && settings.patience != unlimitedPatience) {
      const std::lock_guard lock(mutex);
      patience += settings.patience / patientBytes * static_cast<std::int64_t>(text.size());
      patience = std::min(settings.patience, patience);
    }
    return !abandoned;
  }

  bool write(const Block& block) {
    std::size_t begin = 0;
    for (std::size_t index = 0; index < block.ends.size();) {
      std::size_t end = block.ends[index++];
      while (settings.gathers && index < block.ends.size() && block.ends[index] - begin <= pieceBytes) {
        end = block.ends[index++];
      }
      // What is left of an entry that was cut is not written later as if it were one.
      for (bool isLost = false; begin < end && !isLost;) {
        const std::size_t size = settings.gathers ? std::min(pieceBytes, end - begin) : end - begin;
        if (!put(std::string_view(block.text).substr(begin, size), isLost)) return false;
        begin += size;
      }
      begin = end;
    }
    return true;
  }

  void run() {
    std::unique_lock lock(mutex);
    while (true) {
      if (blocks.empty() && lost > 0 && !closed) tellLoss();
      if (blocks.empty()) {
        progress.notify_all();
        idle = true;
        work.wait(lock, [this] { return ending || !blocks.empty(); });
        idle = false;
        if (blocks.empty()) return;
      }
      {
        const Block block = std::move(blocks.front());
        blocks.pop_front();
        writing = true;
        lock.unlock();
        const bool goesOn = write(block);
        lock.lock();
        writing = false;
        held -= block.cost;
        if (!goesOn) {
          closed = true;
          blocks.clear();
          held = 0;
        }
      }
      progress.notify_all();
      if (abandoned) return;
      work.wait_for(lock, gatheringTime, [this] { return ending || blocks.size() > 1 || hurries > 0; });
    }
  }
};

namespace {

// The logs that live. Never destroyed: the process may end while one of them still writes.
struct LivingLogs {
  std::mutex mutex;
  std::vector<LogWriter*> logs;
};

LivingLogs& livingLogs() {
  static auto* all = [] {
    // A write to a closed pipe or beyond what a file may have must report an error, not end the process.
    std::signal(SIGPIPE, SIG_IGN);
    std::signal(SIGXFSZ, SIG_IGN);
    ::pthread_atfork(nullptr, nullptr, [] { ++forks; });
    std::atexit([] { drainLogs(logsEndTime); });
    return new LivingLogs;
  }();
  return *all;
}

}  // namespace

LogWriter::LogWriter(Settings settings, Output output) {
  LivingLogs& living = livingLogs();
  state_ = std::make_shared<State>(std::move(settings), std::move(output));
  const std::lock_guard lock(living.mutex);
  living.logs.push_back(this);
}

LogWriter::~LogWriter() {
  {
    LivingLogs& living = livingLogs();
    const std::lock_guard lock(living.mutex);
    std::erase(living.logs, this);
  }
  if (state_->isOfAnotherProcess()) return;
  const bool isWritten = drain(logsEndTime);
  {
    const std::lock_guard lock(state_->mutex);
    state_->ending = true;
    if (!isWritten) state_->abandoned = true;
    state_->work.notify_one();
  }
  if (!state_->thread.joinable()) return;
  if (isWritten) {
    state_->thread.join();
  } else {
    state_->thread.detach();
  }
}

void LogWriter::append(std::string_view entry) {
  State& state = *state_;
  if (state.closed || entry.empty()) return;
  if (state.isOfAnotherProcess()) {
    state.output(entry);
    return;
  }
  std::unique_lock lock(state.mutex);
  if (!state.thread.joinable()) {
    try {
      state.thread = startThread(state.settings.label, [shared = state_] { shared->run(); });
    } catch (const std::system_error&) {
      // Without a thread there is nobody else to write it.
      if (state.output(entry) == Outcome::Closed) state.closed = true;
      return;
    }
  }
  // Once lines are dropped, they are until half of the room is there again: one gap, and not a gap after each line.
  const bool waitsForHalf = state.dropping && state.held > state.settings.mostBytes / 2;
  state.dropping = waitsForHalf || !state.waitForRoom(lock, entry.size());
  if (state.dropping) {
    state.lose(entry);
  } else if (!state.closed) {
    state.tellLoss();
    state.keep(entry);
    state.wakeThread();
  }
}

bool LogWriter::drain(nanoseconds atMost) {
  State& state = *state_;
  if (state.isOfAnotherProcess()) return true;
  std::unique_lock lock(state.mutex);
  ++state.hurries;
  state.work.notify_one();
  const auto isWritten = [&state] { return state.isWritten(); };
  if (atMost == unlimitedPatience) {
    state.progress.wait(lock, isWritten);
  } else {
    state.progress.wait_for(lock, atMost, isWritten);
  }
  --state.hurries;
  return isWritten();
}

bool LogWriter::closed() const { return state_->closed; }

LogWriter::Output writeToDescriptor(int fileDescriptor) {
  return [fileDescriptor, atLineEnd = true, cut = false](std::string_view text) mutable {
    std::string ended;
    if (cut && !atLineEnd) {
      ended.append("\n").append(text);
      text = ended;
    }
    int trouble = 0;
    std::size_t done = 0;
    while (done < text.size() && trouble == 0) {
      const ssize_t written = ::write(fileDescriptor, text.data() + done, text.size() - done);
      if (written >= 0) {
        done += static_cast<std::size_t>(written);
      } else if (errno == EAGAIN) {
        // Somebody else made the descriptor non-blocking; a log line is not to be lost for that.
        pollfd ready{fileDescriptor, POLLOUT, 0};
        ::poll(&ready, 1, -1);
      } else if (errno != EINTR) {
        trouble = errno;
      }
    }
    if (done > 0) atLineEnd = text[done - 1] == '\n';
    cut = trouble != 0;
    if (!cut) return LogWriter::Outcome::Taken;
    // No room, now: of the disk, of what the user may have on it, or of what a file may have.
    const bool isShortage = trouble == ENOSPC || trouble == EDQUOT || trouble == EFBIG;
    return isShortage ? LogWriter::Outcome::Lost : LogWriter::Outcome::Closed;
  };
}

void drainLogs(nanoseconds atMost) {
  const auto deadline = SteadyClock::now() + atMost;
  LivingLogs& living = livingLogs();
  const std::lock_guard lock(living.mutex);
  for (LogWriter* log : living.logs) log->drain(std::max(deadline - SteadyClock::now(), nanoseconds::zero()));
}

}  // namespace probeview
