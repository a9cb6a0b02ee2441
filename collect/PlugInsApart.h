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

// A plug-in that is being loaded or is filling its namespaces.
struct TPlugInAtWork {
  std::string fName;   // the name of the plug-in
  std::string fStage;  // such as "fill"
  double fSeconds;     // the time since the stage began
};

struct TApartOptions {
  TApartLimits fLimits;
  std::size_t fParallel = 0;  // the maximum number of concurrent processes; 0: the number of processors that this process may use

  // Whether the processes also measure the memory and the cost of each class (TClassCost), and look for traces (TTraces).
  bool fMeasures = false;

  // Called several times a second with the plug-ins that are running, and at the end with none. May be empty.
  std::function<void(std::vector<TPlugInAtWork> const&)> fShowProgress;
};

// Like LoadPlugIns, but runs each plug-in in a process of its own, several in parallel, so that a faulty plug-in affects only
// its own result. The namespaces are immutable copies, which the processes send in serialised form. The results are in the
// order of the files. If two plug-ins register providers with the same name, the first one that fills its namespace is used; the
// row of the other one names both, and which comes first.
//
// The printed output of a plug-in is in its result; its log entries are written to this process's log after it has ended. No
// process that a plug-in started outlives this call or this process, with these exceptions: it forks faster than it is killed,
// it waits for a device, or the plug-in has killed both its supervisor and this process.
//
// Forks this process: call it before other threads are started, and start no process meanwhile: for that time this process is
// the parent of orphans, and kills those of a plug-in (process/Children.h). A time limit does not run while this process is
// stopped or busy, as with a slow terminal. A plug-in can read the memory that this process had at that time, so read passwords
// afterwards. Blocks until all plug-ins have ended or exceeded a limit.
std::vector<TPlugIn> LoadPlugInsApart(std::vector<TPlugInFile> files, std::optional<TSample> const& sample = std::nullopt,
                                      TApartOptions const& options = {});

// The same for the plug-ins that FindPlugIns finds. Throws TZEPException only if the plug-in directory cannot be read.
std::vector<TPlugIn> LoadPlugInsApart(std::optional<TSample> const& sample = std::nullopt, TApartOptions const& options = {});

}  // namespace NQRVZEP20
