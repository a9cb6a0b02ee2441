// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "Link.h"
#include "providers/reasons/TComputerSystem.h"
#include "providers/reasons/TRecord.h"

namespace NQRVZEP20 {

bool IsBridge(TLink const& link);

// ZEP_Bridge: the service that forwards frames among the ports of a bridge.
TRecord BridgeRecord(TMachineFiles const& files, TLink const& bridge, TLinks const& links, TComputerSystem const& system);

// ZEP_BridgePort: the use of an interface by a bridge.
TRecord BridgePortRecord(TMachineFiles const& files, TLink const& member, TLinks const& links, TComputerSystem const& system);

}  // namespace NQRVZEP20
