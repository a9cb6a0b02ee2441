// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/processes/Interrupts.h"

#include "core/TNeverDestroyed.h"
#include "tools/zep/output/Failure.h"

#include <poll.h>

#include <array>
#include <optional>

namespace NQRVZEP20::zep {

namespace {

constexpr std::array<int, 3> kSignals = {SIGHUP, SIGINT, SIGTERM};

volatile sig_atomic_t gPending = 0;
std::array<struct sigaction, kSignals.size()> gBefore;

void Remember(int signal) {
  if (gPending == 0) gPending = signal;
}

}  // namespace

TInterruptGuard::TInterruptGuard() {
  struct sigaction action {};
  action.sa_handler = Remember;  // without SA_RESTART
  for (std::size_t n = 0; n < kSignals.size(); ++n) {
    ::sigaction(kSignals[n], nullptr, &gBefore[n]);
    if (gBefore[n].sa_handler != SIG_IGN) ::sigaction(kSignals[n], &action, nullptr);
  }
}

TInterruptGuard::~TInterruptGuard() {
  for (std::size_t n = 0; n < kSignals.size(); ++n) ::sigaction(kSignals[n], &gBefore[n], nullptr);
  if (gPending != 0) ::raise(gPending);
  gPending = 0;
}

TInterruptsBlocked::TInterruptsBlocked() {
  sigset_t signals;
  ::sigemptyset(&signals);
  for (int const signal : kSignals) ::sigaddset(&signals, signal);
  ::sigprocmask(SIG_BLOCK, &signals, &fBefore);
}

TInterruptsBlocked::~TInterruptsBlocked() { ::sigprocmask(SIG_SETMASK, &fBefore, nullptr); }

int PendingInterrupt() { return gPending; }

bool WaitForInput(int file) {
  TInterruptsBlocked const blocked;  // but not during the wait
  pollfd waiting{file, POLLIN, 0};
  while (PendingInterrupt() == 0)
    if (::ppoll(&waiting, 1, nullptr, &blocked.Before()) > 0) return true;
  return false;
}

bool IsInterruptedAtLast() {
  static TNeverDestroyed<std::optional<TInterruptsBlocked>> blocked;
  blocked->emplace();
  bool const isPending = PendingInterrupt() != 0;
  if (isPending) blocked->reset();
  return isPending;
}

EExitStatus StatusOfInterrupt() {
  switch (gPending) {
    case SIGHUP:
      return kExitHangUp;
    case SIGINT:
      return kExitInterrupt;
    default:
      return kExitTermination;
  }
}

void ThrowIfInterrupted(std::string const& what) {
  if (gPending != 0) throw TFailure(StatusOfInterrupt(), what.empty() ? "interrupted" : what + ": interrupted");
}

}  // namespace NQRVZEP20::zep
