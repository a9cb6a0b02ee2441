// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TSystemName.h"
#include "providers/reasons/TMachineFiles.h"
#include "providers/reasons/TRecord.h"

#include <string>
#include <vector>

namespace NQRVZEP20 {

// The SCSI devices of this machine, including USB and SATA disks, as the kernel lists them.

struct TScsiPlace {
  TMachineFiles fFiles;
  std::string fPath;
};

// The directory in which the kernel lists them, or for tests the one named by the environment variable ZEP_SCSI_DEVICES.
TScsiPlace ScsiDirectory(TMachineFiles const& files);

// One record per device, in the order of their addresses. A device that is removed during the call is omitted.
std::vector<TRecord> ScsiRecords(TScsiPlace const& directory, TSystemName const& name);

// A record without values, which declares the class, and the reason why there are no devices.
TRecord ScsiShape(TSystemName const& name);
TMissing WhyNoScsiDevices(TScsiPlace const& directory);

}  // namespace NQRVZEP20
