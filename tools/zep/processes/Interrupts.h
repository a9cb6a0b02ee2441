// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/output/ExitStatus.h"

#include <signal.h>

#include <string>

namespace NQRVZEP20::zep {

// While a guard exists, SIGHUP, SIGINT and SIGTERM do not end zep immediately, so that it can clean up and report what remains.
// They interrupt blocking calls, and take effect when the guard is destroyed; the guard must therefore outlive the handler that
// prints the message. If several signals arrive, only the first one takes effect. An ignored signal stays ignored.
class TInterruptGuard {
public:
  TInterruptGuard();
  ~TInterruptGuard();
  TInterruptGuard(TInterruptGuard const&) = delete;
  TInterruptGuard& operator=(TInterruptGuard const&) = delete;
};

// While an object exists, these signals are blocked for zep and for the programs that it starts, so that a Ctrl-C on the
// terminal does not interrupt a program halfway. They are delivered when the object is destroyed.
class TInterruptsBlocked {
public:
  TInterruptsBlocked();
  ~TInterruptsBlocked();
  TInterruptsBlocked(TInterruptsBlocked const&) = delete;
  TInterruptsBlocked& operator=(TInterruptsBlocked const&) = delete;

  // The signals that were blocked before.
  sigset_t const& Before() const { return fBefore; }

private:
  sigset_t fBefore;
};

// The signal that has arrived but has not taken effect yet; 0 if there is none.
int PendingInterrupt();

// Blocks until the file can be read without blocking. Returns false as soon as an interrupt is pending, even one that arrives
// immediately before the wait, which a blocking call would miss.
bool WaitForInput(int file);

// Call it when only the outcome remains to be printed. Returns true if an interrupt is pending, which will then end zep.
// Otherwise signals have no effect from now on, and zep exits with the status that it prints.
bool IsInterruptedAtLast();

// The exit status for the pending interrupt in a document.
EExitStatus StatusOfInterrupt();

// If an interrupt is pending, throws TFailure with that status and the message "`what`: interrupted", or "interrupted" if
// `what` is empty.
void ThrowIfInterrupted(std::string const& what = "");

}  // namespace NQRVZEP20::zep
