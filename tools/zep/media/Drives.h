// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/media/Media.h"

#include <cstdint>
#include <set>
#include <string>
#include <vector>

namespace NQRVZEP20::zep {

// The number of a block device; 0 for what is none.
std::uint64_t NumberOf(std::string const& path);

// Whether the kernel knows the one block device as a partition of the other.
bool IsPartitionOf(std::string const& partition, std::string const& device);

// What has to be unmounted before it can be taken out: the drives that a mounted file system is on, whether by partitions
// or by encrypted or logical volumes. For comparing only; a file system that is on no drive has a name here as well.
using TDrives = std::set<std::string>;
TDrives DrivesOf(TMount const& mount);

// Where something of these drives is mounted now.
std::vector<std::string> MountPointsOf(TDrives const& drives);

}  // namespace NQRVZEP20::zep
