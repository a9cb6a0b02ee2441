// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "Ipmi.h"
#include "platform/include/controllerPlugIn.h"
#include "providers/reasons/TMachineFiles.h"

#include <chrono>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// The files of the kernel's IPMI driver, under its present and former names.
std::vector<std::string> LocalDevices();

// The controller of this machine, through the first device that exists, and libfreeipmi. The first command opens the device. Each
// command fails with the reason if none exists. The returned function owns the open device; call it from one thread at a
// time. A command blocks as long as the driver does: see InThreads.
TIpmi LocalConnection(std::vector<std::string> const& devices = LocalDevices());

// A session of the front end.
TIpmi SessionConnection(TZepController const& controller);

// Sends no command after `limit`, or after one that was not answered: each of them would take its own time.
TIpmi WithinTime(TIpmi ipmi, std::chrono::steady_clock::duration limit);

// Sends each command by a thread of its own, for a library that may hang. When `ipmi` has not returned by the limit, its
// thread and a copy of it remain until the process ends; send no further command then (WithinTime).
TIpmi InThreads(TIpmi ipmi, std::chrono::steady_clock::duration limit);

// The recorded answers below the root of `files`, or those of `ipmi`, which are recorded if ZEP_RECORD_ANSWERS is set
// (TMachineFiles::Answer). There is a file for each request, without its reservation: "ipmi/0a23-01000005".
TIpmi Recorded(TIpmi ipmi, TMachineFiles const& files);

}  // namespace NQRVZEP20
