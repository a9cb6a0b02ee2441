// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TZEPStatusCode.h"
#include "tools/zep/output/ExitStatus.h"

#include <atomic>
#include <cstdint>
#include <functional>
#include <string>

namespace NQRVZEP20::zep {

constexpr int kUsualStallSeconds = 60;

// How a transfer is watched for a stall, which means that no bytes move.
struct TWatch {
  std::string fFile;                                   // a local file whose size is the number of bytes moved
  std::atomic<std::uint64_t> const* fMoved = nullptr;  // or else that number, in memory shared with the process
  // The longest stall allowed; 0: no limit. After an upload has read its last byte, the count no longer changes: what is still in
  // the send buffers of the system must reach the server within this time.
  int fStallSeconds = kUsualStallSeconds;
  std::uint64_t fMostBytes = 0;                            // the size limit for files that the transfer writes; 0: none
  std::function<void(std::uint64_t bytes)> fShowProgress;  // called about ten times a second; may be empty
  std::atomic<bool> const* fIsFinishing = nullptr;         // shared like fMoved: while it is true, no stall is detected
};

struct TOutcome {
  TZEPStatusCode fStatus;             // the status of the library
  EExitStatus fExit = kExitComplete;  // the exit status of zep for it
  std::string fReason;                // why it failed, for the user
};

// Runs one transfer in a child process, which is killed when the transfer stalls, because the library itself would wait for ever,
// or when an interrupt is pending (Interrupts.h). The child reads no input and prints nothing. Returns the status that `transfer`
// returns or throws, with the reason of a TZEPFailure.
TOutcome RunWatched(std::function<TZEPStatusCode()> const& transfer, TWatch const& watch);

// The outcome for the pending interrupt (Interrupts.h).
TOutcome Interrupted();

}  // namespace NQRVZEP20::zep
