// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "MountInfo.h"
#include "TBlockDevice.h"
#include "TUdevRecord.h"

#include <map>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// A block device with its record of udev.
struct TKnownDevice {
  TBlockDevice fDevice;
  TUdevRecord fUdev;
  TFinding<std::string> fNumber;
};

// A file system with all its mounts.
struct TFileSystem {
  enum EPlace {
    kOnDevice,  // on a block device
    kInMemory,  // or above other file systems: tmpfs, overlay
    kElsewhere  // on a server, or served by a program
  };

  std::string fName;    // the node of its device; without a device, its source and mount point
  std::string fDevice;  // the kernel's name of the device; empty without one
  std::string fType;    // "ext4"
  EPlace fPlace = kOnDevice;
  TFinding<std::string> fLabel = TMissing();
  std::vector<TMount> fMounts;  // empty if it is not mounted
  bool fIsCovered = false;      // another file system is mounted over its first mount point
};

// The file systems of the machine, mounted or not, except those that only show objects of the kernel, such as proc and cgroup2.
std::vector<TFileSystem> FileSystemsOf(std::vector<TMount> const& mounts, std::vector<TKnownDevice> const& devices);

}  // namespace NQRVZEP20
