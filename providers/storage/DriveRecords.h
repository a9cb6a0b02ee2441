// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "SmartReport.h"
#include "TDisk.h"
#include "providers/reasons/TComputerSystem.h"
#include "providers/reasons/TRecord.h"

namespace NQRVZEP20 {

// Drives, their packages and their firmware as records of CIM classes.

// A drive other than a disk. `className`: CIM_CDROMDrive, CIM_DisketteDrive or CIM_TapeDrive.
TRecord DriveRecord(char const* className, TMachineFiles const& files, TDisk const& disk, TComputerSystem const& system);

// A CIM_DiskDrive: the same properties, and those of a disk.
TRecord DiskDriveRecord(TMachineFiles const& files, TDisk const& disk, TSmartReport const& health, TComputerSystem const& system);

// The thing that can be held and replaced, with maker, model and serial number: a CIM_PhysicalPackage.
TRecord PackageRecord(TDisk const& disk);

// A CIM_SoftwareIdentity.
TRecord FirmwareRecord(TDisk const& disk);

}  // namespace NQRVZEP20
