// SPDX-License-Identifier: Apache-2.0
#include "ui/status_line.h"

#include <algorithm>
#include <cstdint>

namespace probeview {

namespace {

constexpr std::int64_t secondsPerDay = 86400;

std::int64_t floorDivided(std::int64_t number, std::int64_t divisor) {
  return number / divisor - (number % divisor < 0 ? 1 : 0);
}

std::string twoDigits(std::int64_t number) { return (number < 10 ? "0" : "") + std::to_string(number); }

}  // namespace

std::string ageText(std::chrono::nanoseconds age) {
  using std::chrono::duration_cast;
  const auto milliseconds =
      duration_cast<std::chrono::milliseconds>(std::max(age, std::chrono::nanoseconds(0))).count();
  const auto seconds = milliseconds / 1000;
  if (seconds < 10) return std::to_string(seconds) + "." + std::to_string(milliseconds / 100 % 10) + " s";
  if (seconds < 60) return std::to_string(seconds) + " s";
  if (seconds < 60 * 60) return std::to_string(seconds / 60) + " min";
  if (seconds < 2 * secondsPerDay) return std::to_string(seconds / 3600) + " h";
  return std::to_string(seconds / secondsPerDay) + " d";
}

std::string StatusLine::text(const ServiceStatus& status) const {
  const auto& connection = status.connection;
  const auto& lastRecord = status.lastRecord;
  if (!connection.connected) {
    // Why it does not come is worth its place: who waits may be waiting at the wrong socket.
    if (!connection.everConnected) {
      return "Waiting for the baseband service" + (connection.trouble.empty() ? "" : " · " + connection.trouble);
    }
    return "Baseband service away since " + localTime(connection.since) +
           (lastRecord ? ", showing what was last known" : ", nothing received yet");
  }
  if (!lastRecord) return "Connected to the baseband service, nothing received yet";
  // When the values reached us, not when they were measured: a replayed drive may be years old and yet alive.
  const auto age = ageText(clock_.monotonicTime() - lastRecord->receivedMonotonicTime) + " ago";
  return lastRecord->origin.empty() ? "Last record " + age : lastRecord->origin + " · " + age;
}

std::string StatusLine::localTime(std::chrono::milliseconds wallTime) const {
  const auto local = [this](std::chrono::milliseconds time) {
    const auto utc = floorDivided(time.count(), 1000);
    return utc + zone_.periodAt(utc).offset;
  };
  const auto then = local(wallTime);
  const auto day = floorDivided(then, secondsPerDay);
  const auto second = then - day * secondsPerDay;
  const auto timeOfDay = twoDigits(second / 3600) + ":" + twoDigits(second / 60 % 60) + ":" + twoDigits(second % 60);
  if (day == floorDivided(local(clock_.wallTime()), secondsPerDay)) return timeOfDay;
  const std::chrono::year_month_day date{std::chrono::sys_days{std::chrono::days{day}}};
  return std::to_string(static_cast<int>(date.year())) + "-" + twoDigits(static_cast<unsigned>(date.month())) + "-" +
         twoDigits(static_cast<unsigned>(date.day())) + " " + timeOfDay;
}

}  // namespace probeview
