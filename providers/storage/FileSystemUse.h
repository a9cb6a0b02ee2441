// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TMachineFiles.h"

#include <string>

namespace NQRVZEP20 {

// The use of a mounted file system, as the system call statvfs reports it. Sizes are in bytes.
struct TFileSystemUse {
  unsigned long fBlockSize, fFragmentSize;  // for reading and writing; the unit of allocation
  unsigned long fSize, fFree, fAvailable;   // fAvailable: for users other than root
  unsigned long fFiles, fFreeFiles;         // inodes; both 0 for a file system that does not limit them
  unsigned long fMaxNameLength;
};

// Parses the text that is recorded for the call: eight numbers in decimal, separated by blanks, with sizes in fragments.
TFinding<TFileSystemUse> UseFrom(std::string const& text);

// Calls statvfs for the mount point. The call blocks as long as the file system does: not to be used for network file systems.
TFinding<TFileSystemUse> UseOf(TMachineFiles const& files, std::string const& mountPoint);

}  // namespace NQRVZEP20
