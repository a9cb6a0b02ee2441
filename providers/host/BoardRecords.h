// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TSmbiosStructure.h"
#include "TSystemName.h"
#include "providers/reasons/TRecord.h"

#include <cstdint>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// SMBIOS structures of boards and of the elements on them as records of CIM classes and of the classes in the MOF files of this
// folder. `source`: the source of the values. `number` counts the instances of the class, from 0.

TRecord BoardRecord(TSmbiosStructure const& board, std::string const& source, unsigned number);           // type 2
TRecord SlotRecord(TSmbiosStructure const& slot, std::string const& source, unsigned number);             // type 9
TRecord MemoryArrayRecord(TSmbiosStructure const& array, std::string const& source, unsigned number);     // type 16
TRecord OnboardDeviceRecord(TSmbiosStructure const& device, std::string const& source, unsigned number);  // type 41
TRecord IpmiRecord(TSmbiosStructure const& interface, std::string const& source, unsigned number, TSystemName const& name);  // 38

// The handles of the structures that the board contains (type 2).
std::vector<std::uint16_t> HandlesOn(TSmbiosStructure const& board);

// How the modules of a memory array detect and correct errors (type 16): "Single-bit ECC".
TFinding<std::string> ErrorCorrectionOf(TSmbiosStructure const& array);

}  // namespace NQRVZEP20
