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

// The bundled sample: the SMBIOS table of an invented server, labelled SAMPLE. Throws std::runtime_error when it is not
// installed.
TSample BundledSample();

// The bundled sample for a command that was called with --sample; otherwise none.
std::optional<TSample> SampleIf(bool isWanted);

// How a command loads plug-ins.
struct TPlugInArguments {
  bool fInProcess = false;
  int fTimeoutSeconds = 60;
  std::uint64_t fMemoryMebibytes = 0;  // 0: no limit
};

void AddPlugInOptions(CLI::App& command, TPlugInArguments& arguments);

// The plug-ins, each loaded in a process of its own, or in this one. While they work, their progress is shown on the terminal of
// standard error; afterwards what they printed is written there.
std::vector<TPlugIn> LoadPlugInsFor(TPlugInArguments const& arguments, std::optional<TSample> const& sample);

}  // namespace NQRVZEP20::zep
