// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TBlockDevice.h"
#include "TUdevRecord.h"
#include "providers/reasons/TComputerSystem.h"
#include "providers/reasons/TRecord.h"

namespace NQRVZEP20 {

// The space on disks as records of CIM classes: whole media, partitions, and devices without hardware of their own.

// What all extents have in common. `className`: CIM_StorageExtent for the medium of a drive, or one of its subclasses.
// `elementName`: the name for people.
TRecord ExtentRecord(char const* className, TMachineFiles const& files, TBlockDevice const& device, TComputerSystem const& system,
                     TFinding<std::string> const& elementName, std::string const& superClass = "");

// The kind of partition table of a disk.
enum class EPartitionTable { kMbr, kGpt, kOther };

// A partition with its entry in the partition table.
struct TPartition {
  TBlockDevice fDevice;
  EPartitionTable fTable = EPartitionTable::kOther;
  TUdevRecord fUdev{TMissing()};
  TFinding<unsigned long> fStart = TMissing();  // in bytes, from the beginning of the disk
  TFinding<unsigned long> fSize = TMissing();   // in bytes
};

TPartition PartitionOf(TMachineFiles const& files, TBlockDevice const& device, TUdevRecord const& udev);

// A CIM_DiskPartition for a partition of an MBR, a CIM_GPTDiskPartition for one of a GPT, otherwise a CIM_GenericDiskPartition.
TRecord PartitionRecord(TMachineFiles const& files, TPartition const& partition, TComputerSystem const& system);

// Where an extent lies on another one, in bytes: the properties of CIM_BasedOn. `order`: the place among the extents that an
// extent is based on, from 1; 0 if they have no order.
TRecord BasedOnRecord(TFinding<unsigned long> const& start, TFinding<unsigned long> const& size, unsigned short order = 0);

}  // namespace NQRVZEP20
