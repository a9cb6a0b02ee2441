// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace NQRVZEP20::zep {

// While one lives, SIGHUP, SIGINT and SIGTERM do not end zep at once, so that what it made can be removed and what is left be
// told. They interrupt what waits, and have their effect at the end of the guard. A signal that is ignored stays so.
class TInterruptGuard {
public:
  TInterruptGuard();
  ~TInterruptGuard();
  TInterruptGuard(TInterruptGuard const&) = delete;
  TInterruptGuard& operator=(TInterruptGuard const&) = delete;
};

// The signal that came, and has not had its effect; 0 when none did.
int PendingInterrupt();

// Throws std::runtime_error when one came.
void ThrowIfInterrupted();

}  // namespace NQRVZEP20::zep
