// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "MemoryTotals.h"
#include "providers/reasons/TMachineFiles.h"
#include "providers/reasons/TRecord.h"

#include <cstdint>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// The state of the running system (ZEP_RunningState.mof).
TRecord RunningRecord(TMachineFiles const& files, TMemInfo const& memory);

// The words for the bits of /proc/sys/kernel/tainted, each with the letter that the kernel prints for it:
// "P: a proprietary module was loaded". A bit without a meaning becomes "bit 40".
std::vector<std::string> TaintWords(std::uint64_t taint);

// The names in the output of `systemctl --failed --output=json`, which is an array of objects with a member "unit".
TFinding<std::vector<std::string>> FailedUnitsFrom(std::string const& json);

// Whether the kernel considers its clock synchronised. `bytes`: struct timex as adjtimex fills it.
TFinding<bool> IsSynchronized(std::string const& bytes);

}  // namespace NQRVZEP20
