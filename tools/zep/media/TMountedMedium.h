// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/media/Media.h"

#include <string>

namespace NQRVZEP20::zep {

// A medium that the library has mounted. On failure, every function throws std::runtime_error with the reason, or TWrongUsage
// for an invalid name.
class TMountedMedium {
public:
  // Mounts the device at the library's mount point for it, which is created if it is missing. It is not an error if the device
  // is already mounted there, but it is an error if another device is.
  explicit TMountedMedium(std::string const& device);

  std::string const& Device() const { return fMount.fSource; }  // the mounted device: `device` or its first partition
  std::string const& MountPoint() const { return fMountPoint; }

  // Writes a new file into the root directory and blocks until the complete file is on the medium. Also throws if a file of
  // that name exists or an interrupt is pending (Interrupts.h). If it throws, it leaves no new file on the medium.
  void Write(std::string const& name, std::string const& contents) const;

private:
  std::string fMountPoint;
  TMount fMount;
};

// Unmounts the medium at a directory below /mnt, /media or /run/media; throws TWrongUsage for any other directory. Blocks until
// all data are on the medium. Returns the mount points at which the medium or another partition of its drive is still mounted;
// if there are none, the medium can be removed.
std::vector<std::string> UnmountDirectory(std::string const& directory);

// "can be removed", or "is still mounted at /media/a".
std::string RemovalText(std::vector<std::string> const& stillMountedAt);

}  // namespace NQRVZEP20::zep
