// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "Ipmi.h"
#include "platform/include/controllerPlugIn.h"
#include "providers/reasons/TMachineFiles.h"

#include <chrono>

namespace NQRVZEP20 {

// The controller of this machine, through the IPMI driver of the kernel (/dev/ipmi0) and libfreeipmi. Each command fails with the
// reason if there is no driver. The returned function owns the open device; call it from one thread at a time.
TIpmi LocalConnection();

// A session of the front end.
TIpmi SessionConnection(TZepController const& controller);

// Sends no command after `limit`, or after one that was not answered: each of them would take its own time.
TIpmi WithinTime(TIpmi ipmi, std::chrono::steady_clock::duration limit);

// The recorded answers below the root of `files`, or those of `ipmi`, which are recorded if ZEP_RECORD_ANSWERS is set
// (TMachineFiles::Answer). There is a file for each request: "ipmi/0a23-070001000005".
TIpmi Recorded(TIpmi ipmi, TMachineFiles const& files);

}  // namespace NQRVZEP20
