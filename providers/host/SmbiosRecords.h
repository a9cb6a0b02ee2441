// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "SmbiosVersion.h"
#include "TSmbiosStructure.h"
#include "TSystemName.h"
#include "providers/reasons/TRecord.h"

#include <string>
#include <utility>
#include <vector>

namespace NQRVZEP20 {

// SMBIOS structures as records of CIM classes, with the property names, types and numbers of the DMTF. `source`: the source of
// the values. `number` counts the instances of the class, from 0.

// Further texts about the system, such as those of types 11 and 12.
struct TIdentifyingTexts {
  std::string fSource;
  std::vector<std::pair<std::string, std::string>> fTexts;  // the kind and the text
};

// The version determines the byte order of the UUID. If it is empty, the byte order is that of version 2.6 and later; if it is
// missing because it could not be read, the UUID is missing, too.
TRecord ComputerSystemRecord(TSmbiosStructure const& system, std::string const& source, TSystemName const& name,
                             TFinding<std::optional<TSmbiosVersion>> const& version = std::optional<TSmbiosVersion>(),
                             TIdentifyingTexts const& texts = {});
TRecord BiosRecord(TSmbiosStructure const& bios, std::string const& source, unsigned number);
TRecord ChassisRecord(TSmbiosStructure const& chassis, std::string const& source, unsigned number);
TRecord MemoryRecord(TSmbiosStructure const& memoryDevice, std::string const& source, unsigned number);

// False for a slot that the firmware reports as empty. A structure without that field is treated as filled.
bool IsSlotFilled(TSmbiosStructure const& memoryDevice);

}  // namespace NQRVZEP20
