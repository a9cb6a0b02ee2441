// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TZEPException.h"

#include <grp.h>
#include <sys/wait.h>
#include <unistd.h>

namespace NQRVZEP20 {

// The status that the function throws when a user without privileges calls it; kZEPStatusOK when it throws none, -1 when it
// could not be called. It runs in a child process, whose memory is its own.
template <class TFunction>
int ThrownWhenUnprivileged(TFunction function) {
  constexpr int kNobody = 65534, kNotRun = 255;
  pid_t const child = ::fork();
  if (child == 0) {
    if (::geteuid() == 0 && (::setgroups(0, nullptr) != 0 || ::setgid(kNobody) != 0 || ::setuid(kNobody) != 0)) ::_exit(kNotRun);
    try {
      function();
    } catch (TZEPException const& thrown) {
      ::_exit(thrown.GetStatusCode().GetCode());
    }
    ::_exit(kZEPStatusOK);
  }
  int status = 0;
  if (child < 0 || ::waitpid(child, &status, 0) != child || !WIFEXITED(status)) return -1;
  return WEXITSTATUS(status) == kNotRun ? -1 : WEXITSTATUS(status);
}

}  // namespace NQRVZEP20
