// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "Ipmi.h"
#include "SdrRepository.h"
#include "SelEntry.h"

#include <vector>

namespace NQRVZEP20 {

// The controller's system event log.
struct TEventLog {
  std::uint16_t fCount = 0;                       // of entries, as the controller reports it
  TFinding<std::uint64_t> fRoomFor = TMissing{};  // further entries
  TFinding<std::uint64_t> fClock = TMissing{};    // seconds since 1970; missing if it is not set
  bool fHasLostEntries = false;                   // because it was full
  std::vector<TSelEntry> fEntries;                // the oldest first, in the order of the controller
  TFinding<bool> fIsComplete = true;              // otherwise why the entries after these were not read
};

// Missing if the controller has no event log.
TFinding<TEventLog> ReadEventLog(TIpmi const& ipmi, TProgress const& progress);

}  // namespace NQRVZEP20
