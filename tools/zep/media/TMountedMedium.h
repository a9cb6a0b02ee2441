// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/media/Media.h"

#include <string>

namespace NQRVZEP20::zep {

// A medium that the library has mounted. Every function throws std::runtime_error with the reason, or TWrongUsage for a wrong
// name.
class TMountedMedium {
public:
  // Mounts the device at the library's mount point for it, which is created when it is missing. A device that is already mounted
  // there is accepted; another one there is an error.
  explicit TMountedMedium(std::string const& device);

  std::string const& Device() const { return fMount.fSource; }  // what is mounted: the device or its first partition
  std::string const& MountPoint() const { return fMountPoint; }

  // Writes a file into the root directory. When it returns, the complete file is on the medium. When it throws, also for a
  // pending interrupt (Interrupts.h), there is no file of that name, unless there was one before.
  void Write(std::string const& name, std::string const& contents) const;

private:
  std::string fMountPoint;
  TMount fMount;
};

// Unmounts the medium at a directory below /mnt, /media or /run/media (TWrongUsage for any other). When it returns, all data are
// on the medium. Returns where the medium, or another partition of it, is still mounted: none when it can be taken out.
std::vector<std::string> UnmountDirectory(std::string const& directory);

// "can be taken out", or "is still mounted at /media/a".
std::string WhetherToTakeOut(std::vector<std::string> const& stillMountedAt);

}  // namespace NQRVZEP20::zep
