// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TKernelEvent.h"
#include "providers/reasons/TFinding.h"
#include "providers/reasons/TMachineFiles.h"

#include <chrono>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace NQRVZEP20 {

// The kernel's log, as far as it reports errors.
struct TKernelLog {
  std::uint64_t fRecords = 0;     // of any kind that were read
  std::uint64_t fGone = 0;        // the records before and between these, which newer ones have replaced or which were cleared
  std::uint64_t fUnreadable = 0;  // records in an unknown form
  std::uint64_t fLeftOut = 0;     // events that are not in fEvents, because newer ones of their kind are
  bool fIsWhole = true;           // false if the time was up before the newest record was read
  std::vector<TKernelEvent> fEvents;  // the newest of each kind, in the order of the log
};

constexpr std::size_t kMostKernelEvents = 100;                   // of each kind
constexpr std::size_t kMostKernelBytes = std::size_t(64) << 20;  // of the file of a recorded machine

// Reads the log from its beginning, or from the point at which it was last cleared (dmesg --clear). Does not wait for new
// records. Only the errors are kept, and of them the newest, so that a log of any length takes little memory; a log that grows
// faster than it can be read is left after `limit`. Missing if /dev/kmsg does not exist or cannot be read. A recorded machine
// has the records in a plain file of this name.
TFinding<TKernelLog> ReadKernelLog(TMachineFiles const& files, std::chrono::milliseconds limit = std::chrono::seconds(5));

// The log with these records, one after the other as /dev/kmsg returns them: a line "priority,number,microseconds,flags;text",
// and lines that begin with a blank.
TKernelLog KernelLogFrom(std::string_view records);

}  // namespace NQRVZEP20
