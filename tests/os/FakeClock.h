// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tests/Support.h"

#include <vector>

namespace NQRVZEP20 {

// While one lives, the process's wall clock reads the given times, one after the other; the last of them stays. The zone is
// UTC meanwhile. One at a time, and from one thread.
class TFakeClock {
public:
  // A time of the calendar, in UTC.
  struct TTime {
    int fYear, fMonth, fDay, fHour, fMinute, fSecond;
  };

  explicit TFakeClock(std::vector<TTime> const& times);
  ~TFakeClock();

private:
  TEnvironmentGuard fZone{"TZ", "UTC0"};
};

}  // namespace NQRVZEP20
