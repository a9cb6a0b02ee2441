// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/processes/TChildProcess.h"

#include <functional>
#include <string>

namespace NQRVZEP20::zep {

// The result of one work item, which was processed in a child process.
struct TProcessResult {
  std::size_t fItem;
  bool fIsComplete;     // false: the child did not finish, and fOutput has only the data sent by then
  bool fIsTimeUp;       // it was killed because its time limit expired
  std::string fOutput;  // all data that the child sent
};

struct TProcessLimits {
  std::size_t fParallel;  // the maximum number of concurrent processes, at least 1
  int fTimeoutSeconds;    // for each item
};

using TWork = std::function<void(std::size_t item, TSend const& send)>;

// Runs `work` for the items 0 to `count` - 1, each in a child process, and passes each result to `done` as soon as the child
// has ended. A child that fails does not affect the others. If no process can be created while none is running, the item is
// reported as not complete. The calling process must be single-threaded. Blocks until all items are done.
void RunInProcesses(std::size_t count, TProcessLimits const& limits, TWork const& work,
                    std::function<void(TProcessResult const&)> const& done);

}  // namespace NQRVZEP20::zep
