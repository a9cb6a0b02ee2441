// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TController.h"
#include "providers/reasons/TMachineFiles.h"

namespace NQRVZEP20 {

class TMemoryNamespace;

// Writes what was read from the controller into the empty namespace. `files`: of the machine, for its name.
void FillControllerNamespace(TController const& controller, TMachineFiles const& files, TMemoryNamespace& ns);

}  // namespace NQRVZEP20
