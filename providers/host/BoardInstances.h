// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "HostContext.h"

#include <vector>

namespace NQRVZEP20 {

// Writes boards, slots, memory arrays, onboard devices and IPMI interfaces. `chassis`, `modules`: the chassis and the memory
// modules, which have been written.
void WriteBoards(THostContext const& host, std::vector<TStructureRecord> const& chassis,
                 std::vector<TStructureRecord> const& modules);

}  // namespace NQRVZEP20
