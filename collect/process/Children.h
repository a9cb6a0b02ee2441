// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <sys/types.h>
#include <unistd.h>

#include <optional>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// The children of a process, by default this one, including zombies. Empty when it does not exist, and on a kernel that was built
// without CONFIG_PROC_CHILDREN.
std::vector<pid_t> Children(pid_t process = ::getpid());

struct TProcessState {
  std::string fName;  // of its program
  char fLetter;  // as in proc(5): 'Z' has ended, and its parent has not waited for it; 'T' is stopped; 't' is stopped by a tracer

  bool IsZombie() const { return fLetter == 'Z'; }
  bool IsStopped() const { return fLetter == 'T' || fLetter == 't'; }
};

// None when the process does not exist.
std::optional<TProcessState> StateOf(pid_t process);

// Becomes the parent of processes whose parent has ended, as init usually does, and ends them. The constructor and the destructor
// change this for the whole process (PR_SET_CHILD_SUBREAPER). Use it while no other part of the program starts processes.
class TOrphans {
public:
  TOrphans();
  ~TOrphans();
  TOrphans(TOrphans const&) = delete;
  TOrphans& operator=(TOrphans const&) = delete;

  // Ends every child that was not one at the construction, except these, and waits for at most ten seconds. A process that forks
  // faster than it is ended, or that waits for a device, may remain.
  void End(std::vector<pid_t> const& except) const;

private:
  std::vector<pid_t> New(std::vector<pid_t> const& except) const;

  std::vector<pid_t> const fEarlier;
  int fWasReaper = 0;
};

}  // namespace NQRVZEP20
