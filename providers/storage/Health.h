// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "SmartReport.h"
#include "TDisk.h"
#include "providers/reasons/TRecord.h"

#include <map>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// The health of disks, as the program smartctl reports it.

// The reports by the kernel's names of the disks. Several disks are asked at the same time. Those that have not answered after 20
// seconds, all together, have that as the reason, and so have disks of a kind that has no such report. Blocks until then.
std::map<std::string, TSmartReport> HealthOf(TMachineFiles const& files, std::vector<TDisk> const& disks);

// A ZEP_DiskHealth (ZEP_DiskHealth.mof). `disk`: the kernel's name.
TRecord HealthRecord(std::string const& disk, TSmartReport const& report);

// A ZEP_SmartAttribute (ZEP_SmartAttribute.mof).
TRecord AttributeRecord(std::string const& disk, TSmartAttribute const& attribute);

}  // namespace NQRVZEP20
