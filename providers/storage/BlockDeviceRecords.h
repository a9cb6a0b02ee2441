// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TBlockDevice.h"
#include "TUdevRecord.h"
#include "providers/reasons/TRecord.h"

#include <string>

namespace NQRVZEP20 {

// Facts of block devices that no class of the DMTF schema has a property for.

// The type of a device in the words of lsblk: "disk", "part", "rom", "raid1", "lvm", "crypt", "mpath", "loop".
TFinding<std::string> TypeOf(TMachineFiles const& files, TBlockDevice const& device);

// A ZEP_BlockDevice (ZEP_BlockDevice.mof): node, links, content.
TRecord BlockDeviceRecord(TMachineFiles const& files, TBlockDevice const& device, TUdevRecord const& udev);

// A ZEP_BlockQueue (ZEP_BlockQueue.mof): how the kernel accesses a device. Partitions have none: they share that of their disk.
TRecord BlockQueueRecord(TMachineFiles const& files, TBlockDevice const& device);

}  // namespace NQRVZEP20
