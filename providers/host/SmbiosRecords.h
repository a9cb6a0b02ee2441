// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "SmbiosVersion.h"
#include "TSmbiosStructure.h"
#include "TSystemName.h"
#include "providers/reasons/TRecord.h"

#include <string>

namespace NQRVZEP20 {

// SMBIOS structures as records of CIM classes, with the property names, types and numbers of the DMTF. `source`: the source of
// the values. `number` counts the instances of the class, from 0.

// The version determines the byte order of the UUID. If it is empty, the byte order is that of version 2.6 and later; if it is
// missing because it could not be read, the UUID is missing, too.
TRecord ComputerSystemRecord(TSmbiosStructure const& system, std::string const& source, TSystemName const& name,
                             TFinding<std::optional<TSmbiosVersion>> const& version = std::optional<TSmbiosVersion>());
TRecord BiosRecord(TSmbiosStructure const& bios, std::string const& source, unsigned number);
TRecord ChassisRecord(TSmbiosStructure const& chassis, std::string const& source, unsigned number);
TRecord ProcessorRecord(TSmbiosStructure const& processor, std::string const& source, unsigned number, TSystemName const& name);
TRecord MemoryRecord(TSmbiosStructure const& memoryDevice, std::string const& source, unsigned number);

// False for a socket or slot that the firmware reports as empty. A structure without that field is treated as filled.
bool IsSocketFilled(TSmbiosStructure const& processor);
bool IsSlotFilled(TSmbiosStructure const& memoryDevice);

}  // namespace NQRVZEP20
