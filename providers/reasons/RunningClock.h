// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMDateTime.h"
#include "TMachineFiles.h"

#include <cstdint>

namespace NQRVZEP20 {

// A point in time in UTC. Missing if it is after the year 9999.
TFinding<TCIMDateTime> DateTimeFrom(std::uint64_t secondsSince1970, unsigned microSeconds = 0);

// The time that the DMTF schema prescribes for a record of a log if its time is unknown. Such a time is part of the key, so that
// it cannot be NULL.
TCIMDateTime UnknownTime();

// When the machine was started, and the time at which its files were read. Both are in UTC, in whole seconds.
struct TRunningClock {
  TFinding<std::uint64_t> fBootSeconds = TMissing{};  // since 1970
  TFinding<TCIMDateTime> fBootTime = TMissing{};
  TFinding<TCIMDateTime> fTime = TMissing{};
  TFinding<std::uint64_t> fUptime = TMissing{};  // in seconds
};

TRunningClock RunningClockOf(TMachineFiles const& files);

}  // namespace NQRVZEP20
