// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/media/Media.h"

#include <cstdint>
#include <set>
#include <string>
#include <vector>

namespace NQRVZEP20::zep {

// The number of a block device; 0 for any other file.
std::uint64_t NumberOf(std::string const& path);

// Whether the first block device is a partition of the second, according to the kernel.
bool IsPartitionOf(std::string const& partition, std::string const& device);

// The drives that hold a mounted file system, directly, in partitions, or in encrypted or logical volumes: all that is mounted
// from them must be unmounted before they can be taken out. For comparison only; a file system without a drive has a name here,
// too.
using TDrives = std::set<std::string>;
TDrives DrivesOf(TMount const& mount);

// The mount points of these drives.
std::vector<std::string> MountPointsOf(TDrives const& drives);

}  // namespace NQRVZEP20::zep
