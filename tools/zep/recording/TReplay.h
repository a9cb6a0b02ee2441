// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/PlugInFiles.h"
#include "tools/zep/processes/TScratchDirectory.h"
#include "tools/zep/recording/RecordingIndex.h"
#include "tools/zep/recording/TProviderVariables.h"

#include <string>
#include <vector>

namespace NQRVZEP20::zep {

// While an object exists, plug-ins that are loaded read the machine of a recording, which is unpacked into a private temporary
// directory. The destructor removes it.
class TReplay {
public:
  // Throws TFailure with kExitNoInput if the file is refused: nothing of it is used.
  explicit TReplay(std::string const& file);

  TRecordingIndex const& Index() const { return fIndex; }

  // Leaves out the plug-ins of which the recording has nothing, because they would describe this machine, and names them on
  // standard error, and those that are missing here.
  std::vector<TPlugInFile> Choose(std::vector<TPlugInFile> const& files) const;

private:
  std::string fFile;
  TScratchDirectory fDirectory;
  TRecordingIndex fIndex;
  TProviderVariables fVariables;
};

}  // namespace NQRVZEP20::zep
