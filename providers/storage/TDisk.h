// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "Attachment.h"
#include "TUdevRecord.h"
#include "VpdPages.h"

#include <string>
#include <vector>

namespace NQRVZEP20 {

// The identity of a drive, from sysfs, its VPD pages and the udev database. Nothing is read from the drive itself.
//
// A plain value: copies are deep.
struct TDisk {
  TBlockDevice fDevice;
  TUdevRecord fUdev;
  TAttachment fAttachment;
  TFinding<std::string> fVendor, fModel, fSerialNumber, fFirmware;
  TFinding<std::string> fState;            // the kernel's word: "running", "offline", "live"
  TFinding<unsigned> fRotationsPerMinute;  // 0 for a disk that does not rotate
  TFinding<unsigned> fFormFactor;          // the codes of TCharacteristics
  std::vector<TDesignator> fDesignators;   // names that are unique in the world, the best first
};

TDisk DiskOf(TMachineFiles const& files, TBlockDevice const& drive, TUdevRecord const& udev);

}  // namespace NQRVZEP20
