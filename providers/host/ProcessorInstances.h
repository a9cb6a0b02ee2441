// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "HostContext.h"
#include "TKernelProcessors.h"

#include <vector>

namespace NQRVZEP20 {

// The processors as the kernel knows them, and the records that were written for them.
struct TProcessorInstances {
  TFinding<TKernelProcessors> fKernel;
  std::vector<TRecord> fProcessors;          // by the number of the socket
  std::vector<std::vector<TRecord>> fCores;  // of each socket that the kernel knows
};

// Writes processors, their capabilities, settings and cores, and the weaknesses. The sockets of the firmware and of the kernel
// are matched in their order.
TProcessorInstances WriteProcessors(THostContext const& host);

}  // namespace NQRVZEP20
