// SPDX-License-Identifier: Apache-2.0
#include "collect/findings/AgeText.h"

namespace NQRVZEP20 {

namespace {

std::string Counted(std::uint64_t count, char const* unit) {
  return std::to_string(count) + " " + unit + (count == 1 ? " ago" : "s ago");
}

}  // namespace

std::string AgeText(std::uint64_t seconds) {
  constexpr std::uint64_t minute = 60, hour = 3600;
  if (seconds < minute) return "less than a minute ago";
  if (seconds < hour) return Counted(seconds / minute, "minute");
  if (seconds < 2 * kSecondsOfADay) return Counted(seconds / hour, "hour");
  return Counted(seconds / kSecondsOfADay, "day");
}

}  // namespace NQRVZEP20
