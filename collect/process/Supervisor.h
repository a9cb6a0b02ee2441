// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <functional>

namespace NQRVZEP20 {

// What became of the process of a plug-in.
struct TVerdict {
  int fStatus;             // as waitpid gives it
  bool fHadEndedByItself;  // before the supervisor was told to end it
};

// The descriptors of a supervisor.
struct TSupervisorEnds {
  int fControl;  // of a pipe that the owner holds open as long as the plug-in may work
  int fVerdict;  // of a pipe that gets a TVerdict
};

// The life of a supervisor, the process between the owner and a plug-in. It runs `work` in a child, waits until that has ended or
// the pipe of `control` is closed, ends the child and every process that it started, sends the verdict, and ends. The system
// closes the pipe when the owner dies in any way, so no process of a plug-in outlives the owner.
//
// Supervisor and child have sessions of their own: a Ctrl-C on the terminal reaches neither. In the child, all signals have their
// default effect and none is blocked; `work` closes the descriptors that are not its own.
[[noreturn]] void Supervise(TSupervisorEnds const& ends, std::function<void()> const& work);

}  // namespace NQRVZEP20
