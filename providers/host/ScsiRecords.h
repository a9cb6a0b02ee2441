// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TSystemName.h"
#include "providers/reasons/TRecord.h"

#include <string>
#include <vector>

namespace NQRVZEP20 {

// The SCSI devices of this machine, which are also the USB and SATA disks, as the kernel shows them.

// Where the kernel shows them, or what the environment variable ZEP_SCSI_DEVICES says, for tests.
std::string ScsiDirectory();

// One record of each device, in the order of their addresses. A device that goes away meanwhile is left out.
std::vector<TRecord> ScsiRecords(std::string const& directory, TSystemName const& name);

// An example of such a record without values, and why there are none.
TRecord ScsiShape(TSystemName const& name);
TMissing WhyNoScsiDevices(std::string const& directory);

}  // namespace NQRVZEP20
