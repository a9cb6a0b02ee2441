// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TSmbiosStructure.h"
#include "providers/reasons/TRecord.h"

#include <string>

namespace NQRVZEP20 {

// Facts of the firmware for which the classes of the schema have no property, as settings of the instance that has the others.
// Each record is made of one structure, whose source is `source`; `number` is that of the other instance.

// Of type 0 (ZEP_FirmwareSettings.mof).
TRecord FirmwareSettingsRecord(TSmbiosStructure const& bios, std::string const& source, unsigned number);

// Of type 3 (ZEP_ChassisState.mof).
TRecord ChassisStateRecord(TSmbiosStructure const& chassis, std::string const& source, unsigned number);

// Of type 17 (ZEP_MemoryModuleSettings.mof). `array`: the structure of type 16 to which the module belongs.
TRecord ModuleSettingsRecord(TSmbiosStructure const& memoryDevice, TSmbiosStructure const& array, std::string const& source,
                             unsigned number);

// The chip that is the processor, of type 4 (ZEP_ProcessorChip.mof).
TRecord ProcessorChipRecord(TSmbiosStructure const& processor, std::string const& source, unsigned number);

}  // namespace NQRVZEP20
