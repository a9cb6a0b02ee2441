// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "Link.h"
#include "providers/reasons/TComputerSystem.h"
#include "providers/reasons/TRecord.h"

namespace NQRVZEP20 {

// ZEP_NetworkInterface: an interface of the kernel, which frames are sent and received through.
TRecord InterfaceRecord(TLink const& link, TLinks const& links, TComputerSystem const& system);

// ZEP_InterfaceStatistics: its counters.
TRecord StatisticsRecord(TLink const& link, std::string const& source);

// ZEP_VLANEndpoint: the point at which a VLAN interface adds and removes the tags of the frames of the interface below.
TRecord VlanRecord(TLink const& link, TLinks const& links, TComputerSystem const& system);

}  // namespace NQRVZEP20
