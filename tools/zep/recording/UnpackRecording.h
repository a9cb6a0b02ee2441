// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/recording/RecordingIndex.h"

#include <string>

namespace NQRVZEP20::zep {

// Unpacks a recording below `directory`, which is empty: its files are then in `directory`/root. Throws TArchiveError if the
// recording is refused, and std::system_error if a file cannot be written; both leave what was unpacked until then.
TRecordingIndex UnpackRecording(std::string const& file, std::string const& directory);

}  // namespace NQRVZEP20::zep
