// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TSmbiosStructure.h"
#include "TSystemName.h"
#include "providers/reasons/TMachineFiles.h"
#include "providers/reasons/TRecord.h"

#include <string>
#include <vector>

namespace NQRVZEP20 {

struct TSourcedStructure {
  TSmbiosStructure fStructure;
  std::string fSource;
};

// How the machine was started (ZEP_BootSettings.mof). `status`: the structure of type 32. `system`: that of type 1.
TRecord BootRecord(TMachineFiles const& files, TSourcedStructure const& status, TSourcedStructure const& system);

// The trusted platform modules in /sys/class/tpm (ZEP_TrustedPlatformModule.mof).
std::vector<TRecord> TpmRecords(TMachineFiles const& files, TSystemName const& name);

// A record that only declares the class.
TRecord TpmShape(TSystemName const& name);

}  // namespace NQRVZEP20
