#include "os/LocalTime.h"

#include <time.h>

#include <cstdlib>
#include <cstring>

namespace NQRVZEP20 {
namespace {

// Standard time's offset, plus 60 while daylight saving is in force, also where the zone shifts by another amount.
short UTCOffsetOf(std::tm const& fields) {
  if (fields.tm_isdst <= 0) return static_cast<short>(fields.tm_gmtoff / 60);
  return static_cast<short>(-::timezone / 60 + 60);
}

}  // namespace

// What the thread broke down last, and for which text of TZ. The logger reads the time several times a line, and to break a
// second down goes to the file system. Without a destructor, so that it serves a thread to its very end.
struct TLocalClock::TMemory {
  bool fHoldsZone;  // of a text of TZ that fits below, or of no TZ
  bool fHoldsTime;
  bool fHasZone;
  char fZone[64];
  TLocalTime fLast;

  bool IsOfZone(char const* zone) const { return fHoldsZone && (zone ? fHasZone && std::strcmp(fZone, zone) == 0 : !fHasZone); }

  void SetZone(char const* zone) {
    fHoldsTime = false;
    fHasZone = zone != nullptr;
    fHoldsZone = !fHasZone || std::strlen(zone) < sizeof fZone;
    if (fHasZone && fHoldsZone) std::strcpy(fZone, zone);
  }

  void BreakDown(std::time_t time) {
    ::tzset();  // localtime_r alone would not look at TZ again
    ::localtime_r(&time, &fLast.fFields);
    fLast.fTime = time;
    fLast.fUTCOffset = UTCOffsetOf(fLast.fFields);
    fHoldsTime = true;
  }
};

thread_local TLocalClock::TMemory TLocalClock::fgMemory;

TLocalClock::TLocalClock() : fMemory(fgMemory) {
  char const* const zone = std::getenv("TZ");
  if (!fMemory.IsOfZone(zone)) fMemory.SetZone(zone);
}

TLocalTime const& TLocalClock::Now() {
  timespec now;
  ::clock_gettime(CLOCK_REALTIME, &now);
  if (!fMemory.fHoldsTime || fMemory.fLast.fTime != now.tv_sec) fMemory.BreakDown(now.tv_sec);
  fMemory.fLast.fMilliseconds = static_cast<unsigned int>(now.tv_nsec / 1000000);
  return fMemory.fLast;
}

}  // namespace NQRVZEP20
