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

// How a transfer is watched.
struct TWatch {
  std::string fFile;                                   // a local file that grows
  std::atomic<std::uint64_t> const* fMoved = nullptr;  // or else a number that grows, in memory shared with that process
  // The longest standstill allowed; 0: for ever. When an upload has read its last byte, nothing moves any more: what the system
  // still holds back for a slow line goes out unseen, and must have gone by then.
  int fStallSeconds = kUsualStallSeconds;
  std::uint64_t fMostBytes = 0;                            // the largest file that the transfer may write; 0: any
  std::function<void(std::uint64_t bytes)> fShowProgress;  // of these, now and then; may be empty
  std::atomic<bool> const* fIsFinishing = nullptr;         // shared like fMoved: while it is true, no standstill counts
};

struct TOutcome {
  TZEPStatusCode fStatus;             // that the library gave
  EExitStatus fExit = kExitComplete;  // what zep ends with for it
  std::string fReason;                // why it failed, for people
};

// Runs one transfer of the library in a process of its own, which is ended when nothing moves any more: the library itself
// would wait for ever. An interrupt (Interrupts.h) ends it, too. That process reads no input and prints nothing. It passes on the
// status that `transfer` returns or throws, with the reason of a TZEPFailure.
TOutcome RunWatched(std::function<TZEPStatusCode()> const& transfer, TWatch const& watch);

// The outcome when an interrupt is pending (Interrupts.h).
TOutcome Interrupted();

}  // namespace NQRVZEP20::zep
