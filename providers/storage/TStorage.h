// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "Controllers.h"
#include "FileSystems.h"
#include "Health.h"
#include "TDisk.h"
#include "providers/reasons/TComputerSystem.h"
#include "providers/reasons/TMachineFiles.h"
#include "providers/reasons/TRecordWriter.h"

#include <map>
#include <string>
#include <vector>

namespace NQRVZEP20 {

class TMemoryNamespace;

// The state of the steps that describe storage: what has been found, and the records that have been written, by the kernel's
// names of the devices, so that later steps can associate with them.
//
// It keeps references to the namespace and the files.
struct TStorage {
  using TByName = std::map<std::string, TRecord>;

  // Finds the devices, and asks the disks for their health, which may take seconds.
  TStorage(TMemoryNamespace& ns, TMachineFiles const& files);

  TMachineFiles const& fFiles;
  TComputerSystem const fSystem;
  TRecord const fSystemRecord;
  TRecordWriter fWriter;
  std::vector<TKnownDevice> const fDevices;
  std::vector<TDisk> const fDisks;  // all drives
  std::vector<TController> const fControllers;
  std::map<std::string, TSmartReport> const fHealth;
  TDisk const fNoDisk;  // without values, for the declaration of a class
  TByName fDrives, fExtents;
  TByName fPackages;  // also those of controllers, by their addresses
};

// The steps, in the order in which they are called. Each writes its records and associations.
void WriteDrives(TStorage& storage);  // drives, packages, firmware
void WriteControllersAndSlots(TStorage& storage);
void WriteHealth(TStorage& storage);        // health and wear of disks
void WriteExtents(TStorage& storage);       // media, partitions, devices without hardware
void WriteVolumes(TStorage& storage);       // RAID arrays and volumes of the device mapper
void WritePools(TStorage& storage);         // volume groups
void WriteBlockDevices(TStorage& storage);  // what the schema has no property for
void WriteFileSystems(TStorage& storage);   // file systems, mounts, swap areas

}  // namespace NQRVZEP20
