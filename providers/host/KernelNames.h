// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TSystemName.h"
#include "providers/reasons/TMachineFiles.h"

#include <string>

namespace NQRVZEP20 {

// How the running kernel names itself and the machine.
struct TKernelNames {
  std::string fSource;
  TFinding<std::string> fSystem;        // "Linux"
  TFinding<std::string> fHost;          // as reported, so that it may be the placeholder "(none)"
  TFinding<std::string> fRelease;       // "6.1.0-18-amd64"
  TFinding<std::string> fVersion;       // of the build
  TFinding<std::string> fArchitecture;  // "x86_64"
};

// From uname; of a recorded machine without its answer, from the files in /proc/sys/kernel.
TKernelNames KernelNamesOf(TMachineFiles const& files);

// The machine's host name, or the value of the environment variable ZEP_HOST_NAME, so that the table of another machine
// (ZEP_SMBIOS_TABLE) can be reported under that machine's name.
TSystemName SystemNameOf(TKernelNames const& kernel);

}  // namespace NQRVZEP20
