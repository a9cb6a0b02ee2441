// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMDateTime.h"

#include <ctime>

namespace NQRVZEP20 {

// One reading of the wall clock, in local time.
struct TLocalTime {
  std::time_t fTime;  // seconds since the epoch
  std::tm fFields;
  unsigned int fMilliseconds;  // of the second
  short fUTCOffset;            // minutes east of UTC: the zone's standard offset, plus 60 while daylight saving is in force
};

// Reads the wall clock. TZ is read on construction: make one, take the readings that belong together, and discard it.
class TLocalClock {
public:
  TLocalClock();

  // Valid until the next reading on this thread.
  TLocalTime const& Now();

private:
  struct TCache;
  static thread_local TCache fgCache;

  TCache& fCache;  // this thread's
};

// Sets a datetime to the local time, with milliseconds.
void SetToLocalTime(TCIMDateTime& dateTime);

}  // namespace NQRVZEP20
