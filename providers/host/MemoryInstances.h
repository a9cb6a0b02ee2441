// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "HostContext.h"

namespace NQRVZEP20 {

struct TProcessorInstances;

// Writes the memory modules, the main memory, the caches and the NUMA nodes, and returns the modules.
std::vector<TStructureRecord> WriteMemory(THostContext const& host, TProcessorInstances const& processors);

}  // namespace NQRVZEP20
