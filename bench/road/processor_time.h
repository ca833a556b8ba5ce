// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <sys/resource.h>

#include <ctime>

namespace probeview::bench {

// Seconds of processor time of this thread: who else uses the machine does not count.
inline double threadSeconds() {
  timespec time{};
  ::clock_gettime(CLOCK_THREAD_CPUTIME_ID, &time);
  return static_cast<double>(time.tv_sec) + static_cast<double>(time.tv_nsec) * 1e-9;
}

// Seconds of processor time that a process took, in its own code and in the system's.
inline double processorSeconds(const rusage& usage) {
  const auto seconds = [](const timeval& time) {
    return static_cast<double>(time.tv_sec) + static_cast<double>(time.tv_usec) * 1e-6;
  };
  return seconds(usage.ru_utime) + seconds(usage.ru_stime);
}

}  // namespace probeview::bench
