// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/output/ExitStatus.h"

#include <signal.h>

#include <string>

namespace NQRVZEP20::zep {

// While a guard exists, SIGHUP, SIGINT and SIGTERM do not end zep at once, so that it can remove what it made and report what is
// left. They interrupt blocking calls, and have their effect at the end of the guard: a guard must therefore outlive the handler
// that prints the message. Of several signals only the first one counts. A signal that is ignored stays ignored.
class TInterruptGuard {
public:
  TInterruptGuard();
  ~TInterruptGuard();
  TInterruptGuard(TInterruptGuard const&) = delete;
  TInterruptGuard& operator=(TInterruptGuard const&) = delete;
};

// While one exists, these signals are blocked for zep and for the programs that it starts, so that a Ctrl-C on the terminal does
// not end a program in the middle. They arrive at its end.
class TInterruptsBlocked {
public:
  TInterruptsBlocked();
  ~TInterruptsBlocked();
  TInterruptsBlocked(TInterruptsBlocked const&) = delete;
  TInterruptsBlocked& operator=(TInterruptsBlocked const&) = delete;

private:
  sigset_t fBefore;
};

// The signal that arrived and has not had its effect yet; 0 when there is none.
int PendingInterrupt();

// Called when only the outcome is left to be printed. Returns true when an interrupt is pending, which then ends zep. Otherwise
// no interrupt has an effect from now on, and zep ends with the status that it prints.
bool IsInterruptedAtLast();

// The exit status that a document gives for the pending interrupt.
EExitStatus StatusOfInterrupt();

// Throws TFailure with that status when an interrupt is pending. The text is `what` and ": interrupted", or "interrupted" alone.
void ThrowIfInterrupted(std::string const& what = "");

}  // namespace NQRVZEP20::zep
