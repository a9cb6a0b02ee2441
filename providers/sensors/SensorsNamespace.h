// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TMachineFiles.h"

namespace NQRVZEP20 {

class TMemoryNamespace;

// Fills the namespace with the sensors of the machine, its fans and power supplies, the errors that the kernel has counted, and
// those in its log. Throws what the namespace throws. Blocks while it reads the files; a chip on a slow bus may take some
// milliseconds for each sensor.
void FillSensorsNamespace(TMachineFiles const& files, TMemoryNamespace& ns);

}  // namespace NQRVZEP20
