// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "core/TimeZone.h"

#include <sys/stat.h>

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <ctime>
#include <optional>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// What mktime returns for local times in standard time (tm_isdst is 0), without its searches: a subtraction of the zone's
// standard UTC offset, which changes only a few times in a century. The zone's transitions are read from its file.
//
// Each thread has its own. It has no destructor, so that a thread can use it until its very end.
class TStandardTime {
public:
  // That of the zone that TZ names now. The zone is read again when TZ has changed, and within a second when its file has.
  static TStandardTime const& OfZone();

  // mktime's result for a local time, which is given as the seconds that it would have since 1970 in UTC. Empty when only
  // mktime knows: around a change of the standard UTC offset, before the first transition in the zone's file, where leap
  // seconds count, and when the zone cannot be read.
  std::optional<std::int64_t> TimeOf(std::int64_t local) const {
    for (std::size_t i = 0; i < fCount; ++i)
      if (local >= fEras[i].fFrom && local < fEras[i].fTo) return local - fEras[i].fUTCOffset;
    return std::nullopt;
  }

  // Whether two such local times are after 1971 and are known to have the same UTC offset, so that they have the order of their
  // instants.
  bool HaveSameOffset(std::int64_t a, std::int64_t b) const {
    TEra const& latest = fEras.front();
    return std::min(a, b) >= std::max(latest.fFrom, kStartOf1972) && std::max(a, b) < latest.fTo;
  }

private:
  static constexpr std::int64_t kStartOf1972 = 2 * 365 * 86400;

  // A time with the same standard UTC offset throughout.
  struct TEra {
    std::int64_t fFrom, fTo;  // local times
    long fUTCOffset;          // in seconds
  };
  // What identifies the contents of the zone's file.
  struct TFileState {
    bool fExists = false;
    dev_t fDevice = 0;
    ino_t fNumber = 0;
    off_t fSize = 0;
    timespec fModified{};

    static TFileState Of(char const* path);
    bool operator==(TFileState const& other) const;
  };
  class TEraCollector;

  TStandardTime const& Checked();
  void Refresh(std::time_t now);
  void Read();
  void ReadFile(std::string const& path);
  void CollectEras(std::vector<std::int64_t> const& transitions, std::int64_t start);

  TTimeZone fZone;
  std::time_t fCheckedAt = 0;  // when the file was last checked
  TFileState fFile;
  char fPath[256] = {};
  std::size_t fCount = 0;
  std::array<TEra, 16> fEras{};  // the latest first
};

}  // namespace NQRVZEP20
