// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/PlugIns.h"
#include "collect/Sample.h"

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace CLI {
class App;
}

namespace NQRVZEP20::zep {

// The bundled sample: the SMBIOS table of an invented server, labelled SAMPLE. Throws std::runtime_error if it is not
// installed.
TSample BundledSample();

// The bundled sample if the command was called with --sample (`isWanted`); otherwise none.
std::optional<TSample> SampleIf(bool isWanted);

// Which plug-ins a command loads, and how.
struct TPlugInArguments {
  TPlugInChoice fChoice;
  bool fInProcess = false;
  int fTimeoutSeconds = 60;
  std::uint64_t fMemoryMebibytes = 0;  // 0: no limit
};

void AddPlugInOptions(CLI::App& command, TPlugInArguments& arguments);

// Only the options for the limits, and --allow-writable: for a command that loads a certain plug-in.
void AddLimitOptions(CLI::App& command, TPlugInArguments& arguments);

// The files that may be plug-ins.
std::vector<TPlugInFile> FindPlugInsFor(TPlugInArguments const& arguments);

// Loads the plug-ins, each in a process of its own, or with fInProcess in this one. If standard error is a terminal, progress
// is shown on it; afterwards the output of the plug-ins is written to standard error. Blocks until all plug-ins have ended.
std::vector<TPlugIn> LoadPlugInsFor(TPlugInArguments const& arguments, std::optional<TSample> const& sample);
std::vector<TPlugIn> LoadPlugInsFor(TPlugInArguments const& arguments, std::optional<TSample> const& sample,
                                    std::vector<TPlugInFile> const& files);

// Loads this plug-in in a process of its own, which also measures (TApartOptions). Shows progress like LoadPlugInsFor, but does
// not write the output of the plug-in.
TPlugIn LoadPlugInMeasured(TPlugInFile const& file, TPlugInArguments const& arguments);

}  // namespace NQRVZEP20::zep
