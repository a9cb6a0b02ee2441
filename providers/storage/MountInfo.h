// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <vector>

namespace NQRVZEP20 {

// A line of /proc/self/mountinfo. Texts are without the escapes of the file (\040).
struct TMount {
  std::string fId;            // unique while it is mounted
  std::string fNumber;        // of the device, "8:1"; "0:5" for a file system without one
  std::string fRoot;          // the directory of the file system that is mounted: not "/" for a bind mount
  std::string fMountPoint;    // the directory on which it is mounted
  std::string fOptions;       // of this mount: "rw,noatime"
  std::string fPropagation;   // "shared:1 master:2"; empty for a private mount
  std::string fType;          // "ext4"
  std::string fSource;        // "/dev/sda1", "server:/export", "tmpfs"
  std::string fSuperOptions;  // of the file system: "rw,errors=remount-ro"
};

// The mounts in the order of the text. Lines that are malformed are omitted.
std::vector<TMount> MountsFrom(std::string const& text);

// A line of /proc/swaps.
struct TSwap {
  std::string fFile;    // the node or the file
  std::string fType;    // "partition" or "file"
  unsigned long fSize;  // in KiB
  unsigned long fUsed;  // in KiB
  int fPriority;
};

// The swap areas in use. Lines that are malformed are omitted.
std::vector<TSwap> SwapsFrom(std::string const& text);

}  // namespace NQRVZEP20
