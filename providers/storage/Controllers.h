// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TDisk.h"
#include "providers/reasons/TComputerSystem.h"
#include "providers/reasons/TRecord.h"

#include <string>
#include <vector>

namespace NQRVZEP20 {

// A PCI function through which drives are reached.
struct TController {
  std::string fAddress;                           // "0000:00:1f.2"
  std::string fPath;                              // its directory in sysfs
  TFinding<std::string> fTransport = TMissing();  // of its drives
  std::vector<std::string> fDrives = {};          // the kernel's names

  // Whether controller and drive are the same thing.
  bool IsNvme() const { return fTransport && *fTransport == "nvme"; }
};

// The controllers in the order of their drives.
std::vector<TController> ControllersOf(std::vector<TDisk> const& disks);

// A CIM_PCIController.
TRecord ControllerRecord(TMachineFiles const& files, TController const& controller, TComputerSystem const& system);

// The board of a controller: a CIM_PhysicalPackage with the properties of PackageRecord.
TRecord BoardRecord(TController const& controller);

// The name of the PCI slot that the controller, or a bridge on the same board, is in: a directory of /sys/bus/pci/slots. Missing
// if the kernel lists none.
TFinding<std::string> SlotOf(TMachineFiles const& files, TController const& controller);

// A CIM_Slot.
TRecord SlotRecord(TMachineFiles const& files, std::string const& slot);

}  // namespace NQRVZEP20
