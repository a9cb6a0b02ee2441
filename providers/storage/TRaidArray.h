// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TBlockDevice.h"
#include "TUdevRecord.h"
#include "VolumeRecords.h"
#include "providers/reasons/TComputerSystem.h"
#include "providers/reasons/TRecord.h"

#include <string>
#include <vector>

namespace NQRVZEP20 {

// A member of a RAID array: a device that the array uses, or that failed and has not been removed.
struct TRaidMember {
  std::string fArray, fDevice;      // the kernel's names
  TFinding<std::string> fState;     // the kernel's words: "in_sync", "faulty", "spare"
  TFinding<unsigned short> fSlot;   // the place in the array, from 0
  TFinding<unsigned int> fErrors;   // that were corrected
  TFinding<unsigned long> fOffset;  // where the data begin, in bytes
  TFinding<unsigned long> fSize;    // of the data, in bytes
};

// A RAID array of the kernel (MD).
struct TRaidArray {
  TBlockDevice fDevice;
  TFinding<std::string> fLevel = TMissing();        // "raid1"
  TFinding<std::string> fState = TMissing();        // "clean", "active", "inactive"
  TFinding<std::string> fAction = TMissing();       // "idle", "recover", "check"; missing for a level without redundancy
  TFinding<unsigned short> fDisks = TMissing();     // the number of members when it is complete
  TFinding<unsigned short> fDegraded = TMissing();  // the number of members that it lacks, while it runs; see MissingMembers
  TFinding<int> fLayout = TMissing();
  std::vector<TRaidMember> fMembers;
};

TRaidArray RaidArrayOf(TMachineFiles const& files, TBlockDevice const& device);

// How many members may fail at present without loss of data. Missing if level, disks or layout are, or if the number
// of members that an array with redundancy lacks is, as while it does not run.
TFinding<unsigned short> RedundancyOf(TRaidArray const& array);

// The state of an array for OperationalStatus.
TFinding<TVolumeStatus> StatusOf(TRaidArray const& array);

// The part of the synchronisation that is done, in percent. `text`: of the file sync_completed, "1024 / 202752" or "none".
TFinding<unsigned char> ProgressFrom(std::string const& text);

// A ZEP_RaidArray (ZEP_RaidArray.mof), a subclass of CIM_StorageVolume.
TRecord RaidArrayRecord(TMachineFiles const& files, TRaidArray const& array, TUdevRecord const& udev,
                        TComputerSystem const& system);

// A ZEP_RaidMember (ZEP_RaidMember.mof).
TRecord RaidMemberRecord(TRaidMember const& member);

}  // namespace NQRVZEP20
