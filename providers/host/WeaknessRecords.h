// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TMachineFiles.h"
#include "providers/reasons/TRecord.h"

#include <cstdint>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// The weaknesses of processors that the kernel knows, as records of the class in ZEP_ProcessorWeakness.mof: the names in
// /sys/devices/system/cpu/vulnerabilities. Without that directory there are none.
std::vector<TRecord> WeaknessRecords(TMachineFiles const& files);

// `status`: the line of the kernel, such as "Mitigation: Retpolines".
TRecord WeaknessRecord(std::string const& name, TFinding<std::string> const& status);

}  // namespace NQRVZEP20
