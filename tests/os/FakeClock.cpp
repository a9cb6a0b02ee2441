// SPDX-License-Identifier: Apache-2.0
#include "tests/os/FakeClock.h"

#include <sys/syscall.h>
#include <time.h>
#include <unistd.h>

namespace {

std::vector<time_t> gTimes;  // empty: the real clock
std::size_t gNext = 0;

}  // namespace

// Found by the library before that of the C library.
ZEP_EXPORT int clock_gettime(clockid_t clock, timespec* now) noexcept {
  if (gTimes.empty() || clock != CLOCK_REALTIME) return static_cast<int>(::syscall(SYS_clock_gettime, clock, now));
  *now = {gTimes[gNext], 0};
  if (gNext + 1 < gTimes.size()) ++gNext;
  return 0;
}

namespace NQRVZEP20 {

TFakeClock::TFakeClock(std::vector<TTime> const& times) {
  for (TTime const& time : times) {
    tm fields{};
    fields.tm_year = time.fYear - 1900, fields.tm_mon = time.fMonth - 1, fields.tm_mday = time.fDay;
    fields.tm_hour = time.fHour, fields.tm_min = time.fMinute, fields.tm_sec = time.fSecond;
    gTimes.push_back(::timegm(&fields));
  }
  gNext = 0;
}

TFakeClock::~TFakeClock() { gTimes.clear(); }

}  // namespace NQRVZEP20
