// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TMachineFiles.h"

namespace NQRVZEP20 {

class TMemoryNamespace;

// Fills the namespace with the network of a machine. Throws what the namespace throws (TMemoryNamespace.h).
void FillNetworkNamespace(TMemoryNamespace& ns, TMachineFiles const& files);

}  // namespace NQRVZEP20
