// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMDateTime.h"
#include "providers/reasons/TMachineFiles.h"

#include <cstdint>

namespace NQRVZEP20 {

// When the machine was started, and the time at which its files were read. Both are in UTC, in whole seconds.
struct TRunningClock {
  TFinding<TCIMDateTime> fBootTime;
  TFinding<TCIMDateTime> fTime;
  TFinding<std::uint64_t> fUptime;  // in seconds
};

TRunningClock RunningClockOf(TMachineFiles const& files);

}  // namespace NQRVZEP20
