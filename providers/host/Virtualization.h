// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TMachineFiles.h"
#include "providers/reasons/TRecord.h"

namespace NQRVZEP20 {

class TKernelProcessors;

// Whether the system runs on hardware, in a virtual machine or in a container (ZEP_Virtualization.mof).
TRecord VirtualizationRecord(TMachineFiles const& files, TFinding<TKernelProcessors> const& processors);

}  // namespace NQRVZEP20
