// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/ApartLimits.h"
#include "collect/PlugIns.h"

#include <cstddef>
#include <functional>
#include <optional>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// A plug-in at work.
struct TPlugInAtWork {
  std::string fName;   // of the plug-in
  std::string fStage;  // such as "fill"
  double fSeconds;     // since the stage began
};

struct TApartOptions {
  TApartLimits fLimits;
  std::size_t fParallel = 0;  // how many processes work at once; 0: as many as this process may use processors

  // Called several times a second with the plug-ins at work, and at the end with none. May be empty.
  std::function<void(std::vector<TPlugInAtWork> const&)> fShowProgress;
};

// The same as LoadPlugIns, with each plug-in in a process of its own, several at once: whatever a plug-in does costs only its own
// result. The namespaces come from the processes as bytes and do not change. The results are in the order of the names; of two
// providers with the same name the first one counts, and the other one fails.
//
// What a plug-in prints is in its result, and what it logs is logged here after it has ended. When this function returns, or this
// process dies, no process is left that a plug-in started.
//
// It forks this process. Call it before other threads are started. A plug-in sees the memory of this process as it was then; a
// front end that holds passwords reads them afterwards. Throws TZEPException only when the directory of plug-ins cannot be read.
std::vector<TPlugIn> LoadPlugInsApart(std::optional<TSample> const& sample = std::nullopt, TApartOptions const& options = {});

}  // namespace NQRVZEP20
