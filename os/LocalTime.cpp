// SPDX-License-Identifier: Apache-2.0
#include "os/LocalTime.h"

#include "core/TimeZone.h"

#include <time.h>

namespace NQRVZEP20 {
namespace {

// The offset of standard time, plus 60 while daylight saving is in force, even in a zone that shifts by another amount.
short UTCOffsetOf(std::tm const& fields) {
  if (fields.tm_isdst <= 0) return static_cast<short>(fields.tm_gmtoff / 60);
  return static_cast<short>(-::timezone / 60 + 60);
}

}  // namespace

// The last second that the thread converted. The logger reads the time several times a line, and each conversion accesses the
// file system. It has no destructor, so that a thread can use it until its very end.
struct TLocalClock::TCache {
  TTimeZone fZone;
  bool fHoldsTime = false;
  TLocalTime fLast{};

  void BreakDown(std::time_t time) {
    ::tzset();  // localtime_r alone would not look at TZ again
    ::localtime_r(&time, &fLast.fFields);
    fLast.fTime = time;
    fLast.fUTCOffset = UTCOffsetOf(fLast.fFields);
    fHoldsTime = true;
  }
};

thread_local TLocalClock::TCache TLocalClock::fgCache;

TLocalClock::TLocalClock() : fCache(fgCache) {
  if (fCache.fZone.HasChanged()) fCache.fHoldsTime = false;
}

TLocalTime const& TLocalClock::Now() {
  timespec now;
  ::clock_gettime(CLOCK_REALTIME, &now);
  if (!fCache.fHoldsTime || fCache.fLast.fTime != now.tv_sec) fCache.BreakDown(now.tv_sec);
  fCache.fLast.fMilliseconds = static_cast<unsigned int>(now.tv_nsec / 1000000);
  return fCache.fLast;
}

void SetToLocalTime(TCIMDateTime& dateTime) {
  TLocalTime const& now = TLocalClock().Now();
  std::tm const& fields = now.fFields;
  dateTime.Set(static_cast<unsigned short>(fields.tm_year + 1900), static_cast<unsigned short>(fields.tm_mon + 1),
               static_cast<unsigned int>(fields.tm_mday), static_cast<unsigned short>(fields.tm_hour),
               static_cast<unsigned short>(fields.tm_min), static_cast<unsigned short>(fields.tm_sec), now.fMilliseconds * 1000,
               now.fUTCOffset);
}

}  // namespace NQRVZEP20
