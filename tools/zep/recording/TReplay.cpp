// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/recording/TReplay.h"

#include "collect/SafeText.h"
#include "core/Handles.h"
#include "tools/zep/output/Failure.h"
#include "tools/zep/recording/UnpackRecording.h"

#include <fcntl.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <filesystem>
#include <iostream>
#include <system_error>

namespace NQRVZEP20::zep {

namespace {

namespace fs = std::filesystem;

TRecordingIndex UnpackOrThrow(std::string const& file, std::string const& directory) {
  std::error_code ignored;
  if (!fs::is_regular_file(file, ignored)) throw TFailure(kExitNoInput, Printable(file) + " cannot be read: it is not a file");
  if (!TUniqueFd(::open(file.c_str(), O_RDONLY | O_CLOEXEC)))
    throw TFailure(kExitNoInput, Printable(file) + " cannot be read: " + std::strerror(errno));
  try {
    return UnpackRecording(file, directory);
  } catch (TArchiveError const& failure) {
    throw TFailure(kExitNoInput, Printable(file) + " is refused: " + failure.what());
  } catch (std::system_error const& failure) {
    throw TFailure(kExitNotWritten, Printable(file) + " cannot be unpacked into the temporary directory " + Printable(directory) +
                                        ": " + failure.what() + "; free space in it, or name another directory in TMPDIR");
  }
}

}  // namespace

TReplay::TReplay(std::string const& file)
    : fFile(file),
      fDirectory("zep-replay"),
      fIndex(UnpackOrThrow(file, fDirectory.Path())),
      fVariables({{"ZEP_ROOT", fDirectory.Path(kRecordedRoot)},
                  {"ZEP_RECORD_FROM", ""},
                  {"ZEP_SMBIOS_TABLE", ""},
                  {"ZEP_HOST_NAME", ""},
                  {"ZEP_SCSI_DEVICES", ""}}) {}

std::vector<TPlugInFile> TReplay::Choose(std::vector<TPlugInFile> const& files) const {
  std::vector<std::string> missing = fIndex.fPlugIns;
  std::vector<TPlugInFile> chosen;
  for (TPlugInFile const& file : files) {
    std::string const name = fs::path(file.fFile).filename().string();
    missing.erase(std::remove(missing.begin(), missing.end(), name), missing.end());
    if (std::count(fIndex.fPlugIns.begin(), fIndex.fPlugIns.end(), name) > 0)
      chosen.push_back(file);
    else if (file.IsLoaded())
      std::cerr << "zep: " << Printable(fFile) << " has nothing of " << Printable(name) << ", which is therefore not loaded\n";
  }
  for (std::string const& name : missing)
    std::cerr << "zep: " << Printable(name) << ", which was recorded in " << Printable(fFile) << ", is not installed here\n";
  return chosen;
}

}  // namespace NQRVZEP20::zep
