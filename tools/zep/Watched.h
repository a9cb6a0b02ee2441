#pragma once

#include "ExitStatus.h"
#include "TZEPStatusCode.h"

#include <cstdint>
#include <functional>
#include <string>

namespace NQRVZEP20::zep {

constexpr int kUsualStallSeconds = 60;

// How a transfer is watched.
struct TWatch {
  std::string fFile;  // the local file: a download lets it grow, an upload reads it
  bool fIsUpload = false;
  std::string fSecret;  // a password, which no reason is to show
  // The longest standstill allowed; 0: for ever. When an upload has read its last byte, nothing moves any more: what the system
  // still holds back for a slow line goes out unseen, and must have gone by then.
  int fStallSeconds = kUsualStallSeconds;
  std::function<void(std::uint64_t bytes)> fShowProgress;  // of that file, now and then; may be empty
};

struct TOutcome {
  TZEPStatusCode fStatus;             // that the library gave
  EExitStatus fExit = kExitComplete;  // what zep ends with for it
  std::string fReason;                // why it failed, for people
};

// Does one transfer of the library in a process of its own, which can be ended when nothing moves any more: the library itself
// waits for ever. That process reads no input and prints nothing; what it throws is the outcome.
TOutcome RunWatched(std::function<TZEPStatusCode()> const& transfer, TWatch const& watch);

}  // namespace NQRVZEP20::zep
