// SPDX-License-Identifier: Apache-2.0
#include "collect/process/Supervisor.h"

#include "collect/process/Children.h"
#include "collect/process/Descriptors.h"

#include <poll.h>
#include <signal.h>
#include <sys/prctl.h>
#include <sys/signalfd.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <utility>

namespace NQRVZEP20 {

namespace {

constexpr int kMillisecondsToEnd = 20;

void ResetSignals() {
  for (int signal = 1; signal < NSIG; ++signal) ::signal(signal, SIG_DFL);
  sigset_t none;
  ::sigemptyset(&none);
  ::sigprocmask(SIG_SETMASK, &none, nullptr);
}

// A signal for the child's end can be polled.
TUniqueFd BlockAndWatchChildren() {
  sigset_t children;
  ::sigemptyset(&children);
  ::sigaddset(&children, SIGCHLD);
  ::sigprocmask(SIG_BLOCK, &children, nullptr);
  return TUniqueFd(::signalfd(-1, &children, SFD_CLOEXEC | SFD_NONBLOCK));
}

[[noreturn]] void BeChild(pid_t supervisor, std::function<void()> const& work) {
  ::setsid();
  ResetSignals();
  ::prctl(PR_SET_PDEATHSIG, SIGKILL);
  if (::getppid() != supervisor) ::_exit(1);  // it died before the call
  work();
  ::_exit(0);
}

class TSupervised {
public:
  TSupervised(pid_t child, TUniqueFd signals)
      : fChild(child), fSignals(std::move(signals)), fVerdict{0, false, fSignals ? 0 : errno} {}

  // Until the child has ended or the owner has closed the control pipe.
  void WaitForEnd(int control) {
    while (!HasEnded() && Wait(control, -1) == 0) continue;
  }

  // Reaps the child, and orphans that became children. True when the child has ended.
  bool HasEnded() {
    int status = 0;
    for (pid_t ended; !fHasEnded && (ended = ::waitpid(-1, &status, WNOHANG)) > 0;) Note(ended, status);
    return fHasEnded;
  }

  // Ends every child. The children of an ended one become children of this process, and are ended in their turn. The plug-in
  // comes first: most have no other process, and the list of the children takes longer than its end.
  void EndAll() {
    fVerdict.fHadEndedByItself = HasEnded();
    if (!fHasEnded) {
      ::kill(fChild, SIGKILL);
      Wait(-1, kMillisecondsToEnd);
    }
    int status = 0;
    while (true) {
      pid_t ended = ::waitpid(-1, &status, WNOHANG);
      if (ended == 0) {
        KillChildren();
        ended = ::waitpid(-1, &status, 0);
      }
      if (ended > 0) Note(ended, status);
      if (ended < 0 && errno == ECHILD) return;
    }
  }

  TVerdict const& Verdict() const { return fVerdict; }

private:
  // Waits for a signal, the closing of the control pipe (-1: not for that), or these milliseconds (-1: for ever). Returns what
  // poll(2) reports of the control pipe.
  short Wait(int control, int milliseconds) const {
    pollfd polled[] = {{control, POLLIN, 0}, {fSignals.get(), POLLIN, 0}};
    ::poll(polled, 2, milliseconds);
    signalfd_siginfo ignored;
    while (::read(fSignals.get(), &ignored, sizeof ignored) > 0) continue;
    return polled[0].revents;
  }

  // A traced child that stops has a status, too.
  void Note(pid_t ended, int status) {
    if (ended != fChild || WIFSTOPPED(status)) return;
    fHasEnded = true;
    fVerdict.fStatus = status;
  }

  // A child may be stopped. The list is missing on a kernel that was built without it; then only the plug-in itself is ended.
  void KillChildren() const {
    if (!fHasEnded) ::kill(fChild, SIGKILL);
    for (pid_t const child : Children()) ::kill(child, SIGKILL);
  }

  pid_t const fChild;
  TUniqueFd const fSignals;  // of BlockAndWatchChildren
  bool fHasEnded = false;
  TVerdict fVerdict;
};

void Send(int fd, TVerdict const& verdict) { [[maybe_unused]] ssize_t const sent = ::write(fd, &verdict, sizeof verdict); }

[[noreturn]] void GiveUp(int fd) {
  Send(fd, {0, true, errno});
  ::_exit(1);
}

}  // namespace

void Supervise(TSupervisorEnds const& ends, std::function<void()> const& work) noexcept {
  ::setsid();
  ::prctl(PR_SET_CHILD_SUBREAPER, 1);
  pid_t const supervisor = ::getpid();
  pid_t const child = ::fork();  // before all that the plug-in need not wait for
  if (child == 0) BeChild(supervisor, work);
  if (child < 0) GiveUp(ends.fVerdict);

  ResetSignals();
  CloseAllBut({ends.fControl, ends.fVerdict});
  for (int const fd : {0, 1, 2}) MakeNull(fd);
  TSupervised supervised(child, BlockAndWatchChildren());
  if (supervised.Verdict().fStartFailure == 0) supervised.WaitForEnd(ends.fControl);
  supervised.EndAll();
  Send(ends.fVerdict, supervised.Verdict());
  ::_exit(0);
}

}  // namespace NQRVZEP20
