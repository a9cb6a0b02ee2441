// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TSmbiosStructure.h"
#include "TSystemName.h"
#include "providers/reasons/TMachineFiles.h"
#include "providers/reasons/TRecord.h"

#include <string>
#include <vector>

namespace NQRVZEP20 {

// How the machine was started (ZEP_BootSettings.mof). `status`: the structure of type 32, whose source is `source`.
TRecord BootRecord(TMachineFiles const& files, TSmbiosStructure const& status, std::string const& source);

// The trusted platform modules in /sys/class/tpm (ZEP_TrustedPlatformModule.mof).
std::vector<TRecord> TpmRecords(TMachineFiles const& files, TSystemName const& name);

// A record that only declares the class.
TRecord TpmShape(TSystemName const& name);

}  // namespace NQRVZEP20
