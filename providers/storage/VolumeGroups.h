// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "FileSystems.h"
#include "providers/reasons/TFinding.h"
#include "providers/reasons/TMachineFiles.h"
#include "providers/reasons/TRecord.h"

#include <cstdint>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// A volume group of LVM.
struct TVolumeGroup {
  std::string fUuid;  // without hyphens, as in the UUIDs of its volumes
  TFinding<std::string> fName = TMissing();
  TFinding<std::uint64_t> fSize = TMissing(), fFree = TMissing();  // bytes
  std::vector<std::string> fMemberNumbers;                         // of its devices: "8:1"
};

// The arguments with which lvm answers what VolumeGroupsFrom reads.
std::vector<std::string> VolumeGroupArguments();

// The groups in the answer of lvm, in the order of their first devices. Anything else than that answer has no groups.
std::vector<TVolumeGroup> VolumeGroupsFrom(std::string const& answer);

// The groups of these devices, from lvm, which is asked only if a device belongs to LVM. Without its answer, a group is known by
// its volumes, and its sizes are missing with the reason. Blocks for at most two seconds.
std::vector<TVolumeGroup> VolumeGroupsOf(TMachineFiles const& files, std::vector<TKnownDevice> const& devices);

// The UUID of the group of a volume; empty if the device is not a volume of LVM.
std::string GroupOfVolume(TMachineFiles const& files, TBlockDevice const& device);

// A group as a CIM_StoragePool.
TRecord PoolRecord(TVolumeGroup const& group);

}  // namespace NQRVZEP20
