// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/PlugIns.h"
#include "tools/zep/processes/TScratchDirectory.h"
#include "tools/zep/recording/RecordingIndex.h"
#include "tools/zep/recording/TProviderVariables.h"

#include <string>
#include <vector>

namespace NQRVZEP20::zep {

// While an object exists, plug-ins that are loaded record what they read of the machine, which is this one or that below
// ZEP_ROOT. Variables that make them read something else, such as ZEP_SMBIOS_TABLE, have no effect meanwhile.
class TRecorder {
public:
  TRecorder();

  // What was recorded of these plug-ins, as an index and a file of it. A file or link whose name or target is not UTF-8 is left
  // out, with a reason. `thresholds` are those of this machine, for the findings of a replay.
  struct TResult {
    TRecordingIndex fIndex;
    std::string fArchive;
  };
  TResult Finish(std::vector<TPlugIn> const& plugIns, TThresholds const& thresholds) const;

  // Throws TFailure with kExitNotWritten if something that a plug-in read could not be written to the temporary directory: the
  // plug-in read it from there, so it is missing in its answer, too.
  void CheckNothingIsLost() const;

private:
  TScratchDirectory fDirectory;
  TProviderVariables fVariables;
};

}  // namespace NQRVZEP20::zep
