// SPDX-License-Identifier: Apache-2.0

// Unpacks any bytes as a recording. One that is refused has a reason, and nothing appears beside its root.

#include "fuzz/Require.h"
#include "tools/zep/processes/TScratchDirectory.h"
#include "tools/zep/recording/UnpackRecording.h"

#include <sys/mman.h>
#include <unistd.h>

#include <cstdint>
#include <filesystem>
#include <string>

using namespace NQRVZEP20::zep;

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  static int const file = ::memfd_create("recording", MFD_CLOEXEC);
  Require(::ftruncate(file, 0) == 0 && ::pwrite(file, data, size, 0) == static_cast<ssize_t>(size));
  TScratchDirectory const directory("zep-recording-fuzz");
  try {
    UnpackRecording("/proc/self/fd/" + std::to_string(file), directory.Path());
  } catch (TArchiveError const& failure) {
    Require(*failure.what() != '\0');
  }
  for (auto const& entry : std::filesystem::directory_iterator(directory.Path()))
    Require(entry.path().filename() == kRecordedRoot && !entry.is_symlink());
  return 0;
}
