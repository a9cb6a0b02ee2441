// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "Ports.h"
#include "providers/reasons/TComputerSystem.h"
#include "providers/reasons/TRecord.h"

namespace NQRVZEP20 {

// CIM_EthernetPort, or CIM_NetworkPort for InfiniBand, wireless and other ports. The records of a class without values declare
// it: those of EmptyPort.
TRecord PortRecord(TPort const& port, TComputerSystem const& system, std::string const& linkSource);

// ZEP_EthernetPortCapabilities: the link modes.
TRecord CapabilitiesRecord(TPort const& port);

// CIM_SoftwareIdentity.
TRecord DriverRecord(TPort const& port);
TRecord FirmwareRecord(TPort const& port);

// A CIM_PCIDevice that has only its keys: the provider of the PCI devices has one with all the values.
TRecord PciDeviceRecord(std::string const& address, TComputerSystem const& system);

// A port without values.
TPort EmptyPort(bool isEthernet);

}  // namespace NQRVZEP20
