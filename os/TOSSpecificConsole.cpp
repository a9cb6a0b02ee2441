#include "TOSSpecific.h"

#include <time.h>

#include <cstdlib>
#include <cstring>
#include <ctime>

namespace NQRVZEP20 {
namespace {

// The local calendar fields of one second.
struct TLocalSecond {
  std::time_t fTime;
  std::tm fFields;
  short fUTCOffset;  // minutes east of UTC
};

// Standard time's offset, plus 60 while daylight saving is in force, also where the zone shifts by another amount.
short UTCOffsetOf(std::tm const& fields) {
  if (fields.tm_isdst <= 0) return static_cast<short>(fields.tm_gmtoff / 60);
  return static_cast<short>(-::timezone / 60 + 60);
}

TLocalSecond BreakDown(std::time_t time) {
  TLocalSecond second{};
  second.fTime = time;
  ::tzset();  // localtime_r alone would not look at TZ again
  ::localtime_r(&time, &second.fFields);
  second.fUTCOffset = UTCOffsetOf(second.fFields);
  return second;
}

// What this thread broke down last, and for which text of TZ. The logger asks for the time several times a line, and
// tzset goes to the file system when TZ is not set. Without a destructor, so that it serves a thread to its very end.
struct TLastSecond {
  bool fIsKnown;
  bool fHasZone;
  char fZone[64];
  TLocalSecond fSecond;

  bool Serves(std::time_t time, char const* zone) const {
    return fIsKnown && fSecond.fTime == time && (zone ? fHasZone && std::strcmp(fZone, zone) == 0 : !fHasZone);
  }
  void Remember(TLocalSecond const& second, char const* zone) {
    fIsKnown = zone == nullptr || std::strlen(zone) < sizeof fZone;  // a longer text is read afresh each time
    fHasZone = zone != nullptr;
    if (fIsKnown && zone) std::strcpy(fZone, zone);
    fSecond = second;
  }
};
thread_local TLastSecond gLastSecond;

TLocalSecond const& LocalSecondOf(std::time_t time) {
  char const* const zone = std::getenv("TZ");
  if (!gLastSecond.Serves(time, zone)) gLastSecond.Remember(BreakDown(time), zone);
  return gLastSecond.fSecond;
}

}  // namespace

TCIMDateTime TOSSpecific::GetLocalTime() {
  timespec now;
  ::clock_gettime(CLOCK_REALTIME, &now);
  TLocalSecond const& second = LocalSecondOf(now.tv_sec);
  std::tm const& fields = second.fFields;
  auto const milliseconds = static_cast<unsigned int>(now.tv_nsec / 1000000);
  return TCIMDateTime(static_cast<unsigned short>(fields.tm_year + 1900), static_cast<unsigned short>(fields.tm_mon + 1),
                      static_cast<unsigned int>(fields.tm_mday), static_cast<unsigned short>(fields.tm_hour),
                      static_cast<unsigned short>(fields.tm_min), static_cast<unsigned short>(fields.tm_sec), milliseconds * 1000,
                      second.fUTCOffset);
}

}  // namespace NQRVZEP20
