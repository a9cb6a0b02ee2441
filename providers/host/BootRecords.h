// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TSmbiosStructure.h"
#include "providers/reasons/TMachineFiles.h"
#include "providers/reasons/TRecord.h"

namespace NQRVZEP20 {

// How the machine was started (ZEP_BootSettings.mof). `status`: the structure of type 32. `system`: that of type 1.
TRecord BootRecord(TMachineFiles const& files, TSourcedStructure const& status, TSourcedStructure const& system);

}  // namespace NQRVZEP20
