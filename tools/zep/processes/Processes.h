// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <functional>
#include <string>
#include <vector>

namespace NQRVZEP20::zep {

// What a process of its own made of one item of work.
struct TProcessResult {
  std::size_t fItem;
  bool fIsComplete;  // false: it did not come to its end, and fOutput is what it had said until then
  bool fIsTimeUp;    // it was ended because its time was up
  std::string fOutput;
};

struct TProcessLimits {
  std::size_t fParallel;  // how many run at once, at least 1
  int fTimeoutSeconds;    // for each
};

// Runs `work` for the items 0 to `count` - 1, each in a process of its own, and hands each result to `done` as soon as it is
// there. The text that `work` returns is the output. Whatever becomes of a process, the rest go on; an item for which none
// can be made, though no other runs, is not complete. The caller has one thread.
void RunInProcesses(std::size_t count, TProcessLimits const& limits, std::function<std::string(std::size_t)> const& work,
                    std::function<void(TProcessResult const&)> const& done);

}  // namespace NQRVZEP20::zep
