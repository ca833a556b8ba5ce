// SPDX-License-Identifier: Apache-2.0
//
// What every log stands on: its lines are handed to a thread of the log's own, so that whoever logs never waits for who
// reads. No descriptor is made non-blocking for that: it may be one that other processes share.
#pragma once

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <string>
#include <string_view>

namespace probeview {

// How long a program that ends, or stops through fatalError(), waits for its logs to be written.
inline constexpr std::chrono::nanoseconds logsEndTime = std::chrono::seconds(1);

// Holds back what cannot be written yet, up to a bound; what finds no room is dropped, counted, and told in one line
// when there is room again. The thread sleeps while there is nothing to write, and is woken for the first line of many,
// not for each. Any thread.
class LogWriter {
 public:
  enum class Outcome {
    Taken,
    Lost,   // there was no room where it goes; what comes later may find some
    Closed  // nobody takes anything any more
  };
  // Puts the text where it goes and waits for that as long as it must. Called on the log's thread only.
  using Output = std::function<Outcome(std::string_view text)>;

  struct Settings {
    std::string label;   // of the thread
    std::string prefix;  // of the line that tells a loss, such as "radixd: warning: "
    // What may wait, all memory counted; a single entry may be larger while nothing else waits.
    std::size_t mostBytes = 1024 * 1024;
    // How long a caller may be kept, altogether, by a reader that takes nothing while no room is left. Each 64 KiB that
    // the reader takes earn as much again, so that whoever reads gets everything in order, and whoever does not stops
    // nobody. 0: nobody is ever kept. unlimitedPatience: nothing is ever dropped.
    std::chrono::nanoseconds patience{0};
    // Whether entries that wait may be put together, up to the 4096 bytes that a pipe takes in one piece; a longer
    // entry then goes in pieces of so many.
    bool gathers = true;
  };
  static constexpr std::chrono::nanoseconds unlimitedPatience = std::chrono::nanoseconds::max();

  LogWriter(Settings settings, Output output);
  // Writes what waits, for at most logsEndTime.
  ~LogWriter();
  LogWriter(const LogWriter&) = delete;
  LogWriter& operator=(const LogWriter&) = delete;

  // The text is one entry: whole lines with their ends for a descriptor, one message for a system's logger.
  void append(std::string_view entry);
  // Waits until everything is written; false when it is not after the time given.
  bool drain(std::chrono::nanoseconds atMost);
  bool closed() const;

 private:
  struct State;
  std::shared_ptr<State> state_;
};

// An output to a descriptor, which stays the caller's. A line that a full disk has cut is ended before the next one.
LogWriter::Output writeToDescriptor(int fileDescriptor);

// Waits until all logs of the process are written, altogether at most for the time given. fatalError() and the end of
// the process do so.
void drainLogs(std::chrono::nanoseconds atMost);

}  // namespace probeview
