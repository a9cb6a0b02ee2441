// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/processes/TChildProcess.h"

#include <functional>
#include <string>

namespace NQRVZEP20::zep {

// The result of one item of work, which was done in a child process.
struct TProcessResult {
  std::size_t fItem;
  bool fIsComplete;     // false: the child did not finish, and fOutput is what it had sent by then
  bool fIsTimeUp;       // it was ended at its time limit
  std::string fOutput;  // everything that it sent
};

struct TProcessLimits {
  std::size_t fParallel;  // how many run at once, at least 1
  int fTimeoutSeconds;    // for each
};

using TWork = std::function<void(std::size_t item, TSend const& send)>;

// Runs `work` for the items 0 to `count` - 1, each in a child process, and passes each result to `done` as soon as it is
// complete. A child that fails does not stop the others. An item for which no process can be made, although no other runs, is
// not complete. The caller has a single thread.
void RunInProcesses(std::size_t count, TProcessLimits const& limits, TWork const& work,
                    std::function<void(TProcessResult const&)> const& done);

}  // namespace NQRVZEP20::zep
