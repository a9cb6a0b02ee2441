// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TSystemName.h"
#include "providers/reasons/TMachineFiles.h"
#include "providers/reasons/TRecord.h"

#include <vector>

namespace NQRVZEP20 {

// A NUMA node: the memory near some of the CPUs.
struct TNumaNode {
  std::vector<unsigned> fCpus;  // empty for a node that has only memory
  TRecord fRecord;              // of the class in ZEP_NUMANode.mof
};

// The nodes in /sys/devices/system/node, in numeric order.
std::vector<TNumaNode> NumaNodes(TMachineFiles const& files, TSystemName const& name);

// A record that only declares the class.
TRecord NumaShape(TSystemName const& name);

}  // namespace NQRVZEP20
