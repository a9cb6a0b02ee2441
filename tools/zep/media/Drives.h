// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/media/Media.h"

#include <cstdint>
#include <set>
#include <string>
#include <vector>

namespace NQRVZEP20::zep {

// The device number of a block device; 0 for any other file.
std::uint64_t NumberOf(std::string const& path);

// Whether the first block device is a partition of the second, according to the kernel.
bool IsPartitionOf(std::string const& partition, std::string const& device);

// Opaque identifiers of drives, for comparison only. A file system without a drive has an identifier, too.
using TDrives = std::set<std::string>;

// The drives that contain a mounted file system: directly, in a partition, or in an encrypted or logical volume. A drive can be
// removed only after all its file systems are unmounted.
TDrives DrivesOf(TMount const& mount);

// The mount points of the file systems on these drives.
std::vector<std::string> MountPointsOf(TDrives const& drives);

}  // namespace NQRVZEP20::zep
