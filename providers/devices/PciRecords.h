// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "PciAddress.h"
#include "TPciIds.h"
#include "providers/reasons/TComputerSystem.h"
#include "providers/reasons/TMachineFiles.h"
#include "providers/reasons/TRecord.h"

#include <optional>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// The PCI functions of a machine as records of CIM classes, from /sys/bus/pci.

// The link of a PCI Express function.
struct TPciLink {
  TRecord fRecord;                 // ZEP_PCIExpressLink
  TFinding<std::uint64_t> fSpeed;  // now, in bits per second
};

// A function that the kernel lists.
struct TPciFunction {
  std::string fName;  // "0000:03:00.0"
  TPciAddress fAddress;
  std::string fBridge;  // the name of the bridge above; empty on a root bus
  bool fIsBridge;
  TRecord fRecord;                // CIM_PCIDevice or CIM_PCIBridge
  std::optional<TPciLink> fLink;  // only of a PCI Express function
};

// In the order of their addresses. A function that is removed during the call is omitted.
std::vector<TPciFunction> PciFunctions(TMachineFiles const& files, TComputerSystem const& system);

// Records without values, which declare the classes, and the reason why there are no instances.
TRecord PciDeviceShape(TComputerSystem const& system);
TRecord PciBridgeShape(TComputerSystem const& system);
TRecord PciLinkShape(TComputerSystem const& system);
TMissing WhyNoPciDevices(TMachineFiles const& files);

// A slot that the kernel knows by its number or label.
struct TPciSlot {
  std::string fAddress;  // of the device in the slot, without function: "0000:03:00"
  TRecord fRecord;       // CIM_Slot
};

std::vector<TPciSlot> PciSlots(TMachineFiles const& files);
TRecord PciSlotShape();

}  // namespace NQRVZEP20
