// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "Ethtool.h"
#include "Link.h"

#include <string>
#include <vector>

namespace NQRVZEP20 {

// A network interface that is a device of the machine, such as an Ethernet controller of the PCI bus or of a hypervisor.
struct TPort {
  TLink fLink;
  bool fIsWireless;
  TDriverInfo fDriver;
  TLinkSettings fSettings;
  TWakeOnLan fWakeOnLan;
  TFinding<std::string> fPermanentAddress;
  TFinding<std::string> fPciAddress;  // of the controller: "0000:00:03.0"

  bool IsEthernet() const;
};

// The ports among the interfaces. Asks the driver of each.
std::vector<TPort> PortsOf(TMachineFiles const& files, TLinks const& links);

}  // namespace NQRVZEP20
