// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TMachineFiles.h"

#include <string>
#include <vector>

namespace NQRVZEP20 {

// A block device that the kernel lists in sysfs.
//
// A plain value. The default value is a device that does not exist: each of its files is missing, so that a record of it declares
// the class.
struct TBlockDevice {
  enum EKind {
    kDisk,       // a disk, a memory card or a USB stick
    kOptical,    // a CD-ROM, DVD or Blu-ray drive
    kDiskette,   // a floppy drive
    kTape,       // a tape drive, which is not a block device but has such a directory
    kPartition,  // a partition of another device
    kArray,      // a RAID array of the kernel (MD)
    kMapped,     // made by the device mapper: an LVM volume, an encrypted device, a multipath device
    kOther       // without hardware of its own: a loop device, a compressed memory disk, a boot area of a memory card
  };

  std::string fName = "none";                    // the kernel's name: "sda1"
  std::string fPath = "/sys/devices/none/none";  // its directory, without symbolic links
  EKind fKind = kOther;
  std::string fWhole = {};  // the name of the device that a partition is part of; empty for other kinds

  std::string File(std::string const& name) const { return fPath + "/" + name; }
  std::string Node() const;  // "/dev/sda1"

  bool IsDrive() const { return fKind == kDisk || fKind == kOptical || fKind == kDiskette; }
};

// All block devices, partitions after the device that they are part of. It omits devices that are not set up, such as a loop
// device without a file, and paths that the kernel hides because it combines them into another device. It reads sysfs only, which
// does not access the devices.
std::vector<TBlockDevice> BlockDevicesOf(TMachineFiles const& files);

// The SCSI tape drives.
std::vector<TBlockDevice> TapeDrivesOf(TMachineFiles const& files);

// The size in bytes. Missing for a drive without a medium.
TFinding<unsigned long> SizeOf(TMachineFiles const& files, TBlockDevice const& device);

// The number of the device, as "8:1".
TFinding<std::string> NumberOf(TMachineFiles const& files, TBlockDevice const& device);

}  // namespace NQRVZEP20
