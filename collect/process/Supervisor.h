// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <functional>

namespace NQRVZEP20 {

// How a plug-in process ended.
struct TVerdict {
  int fStatus;             // the wait status, as returned by waitpid
  bool fHadEndedByItself;  // it ended before the supervisor was told to kill it
  int fStartFailure;       // the errno for which no process could be started; otherwise 0
};

// The descriptors of a supervisor. It closes all others.
struct TSupervisorEnds {
  int fControl;  // the read end of a pipe that the owner keeps open as long as the plug-in may run
  int fVerdict;  // the write end of a pipe to which a TVerdict is written
};

// The main function of a supervisor, the process between the owner and a plug-in. Runs `work` in a child, waits until the child
// has ended or the owner has closed the control pipe, kills the child and all processes that it started, sends the verdict, and
// exits. The kernel closes the pipe if the owner dies for any reason, so no process of a plug-in outlives both the owner and the
// supervisor.
//
// Supervisor and child each have a session of their own, so a Ctrl-C on the terminal reaches neither. In the child, all signals
// have their default disposition and none is blocked; `work` inherits all descriptors of the owner, and must close those that it
// does not need. An exception ends the process that throws it.
[[noreturn]] void Supervise(TSupervisorEnds const& ends, std::function<void()> const& work) noexcept;

}  // namespace NQRVZEP20
