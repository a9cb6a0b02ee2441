// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ErrorCounts.h"
#include "TPowerSupply.h"
#include "TSensor.h"
#include "providers/reasons/TComputerSystem.h"
#include "providers/reasons/TRecord.h"

namespace NQRVZEP20 {

// Records of the classes of this provider.
TRecord SensorRecord(TSensor const& sensor, TComputerSystem const& system);
TRecord FanRecord(TSensor const& sensor, TComputerSystem const& system);  // of a sensor of the kind kFan
TRecord PowerSupplyRecord(TPowerSupply const& supply, TComputerSystem const& system);
TRecord MemoryErrorsRecord(TMemoryErrors const& errors);
TRecord PciErrorsRecord(TPciErrors const& errors);

}  // namespace NQRVZEP20
