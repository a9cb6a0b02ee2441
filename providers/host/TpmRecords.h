// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TSmbiosStructure.h"
#include "TSystemName.h"
#include "providers/reasons/TMachineFiles.h"
#include "providers/reasons/TRecord.h"

#include <vector>

namespace NQRVZEP20 {

// The trusted platform modules (ZEP_TrustedPlatformModule.mof): those of the kernel in /sys/class/tpm and the structures of
// SMBIOS type 43, matched in their order. A module that the kernel does not list is named "TPM 0", by its number. `files`:
// missing when they are those of another machine. `absent`: a missing structure, for modules that have none.
std::vector<TRecord> TpmRecords(TFinding<TMachineFiles> const& files, std::vector<TSmbiosStructure> const& structures,
                                TSourcedStructure const& absent, TSystemName const& name);

// A record that only declares the class.
TRecord TpmShape(TSourcedStructure const& absent, TSystemName const& name);

}  // namespace NQRVZEP20
