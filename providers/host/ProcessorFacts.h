// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TKernelProcessors.h"

#include <cstdint>
#include <string>
#include <utility>
#include <vector>

namespace NQRVZEP20 {

// The facts that the kernel knows about the processor in a socket.
struct TProcessorFacts {
  TFinding<std::string> fBrand;  // "Intel(R) Xeon(R) Gold 6338 CPU @ 2.00GHz"
  TFinding<std::string> fStepping;
  TFinding<std::uint32_t> fMaxMegahertz;                       // including turbo
  TFinding<std::uint32_t> fCurrentMegahertz;                   // of the first CPU
  TFinding<std::uint16_t> fDataWidth;                          // in bits
  std::uint16_t fCores;                                        // online
  std::uint16_t fThreads;                                      // online
  std::vector<std::pair<std::string, std::string>> fIdentity;  // names and values, such as "Vendor" and "GenuineIntel"
};

TProcessorFacts ProcessorFactsOf(TKernelProcessors::TSocket const& socket, TMachineFiles const& files);

// A frequency in a file of cpufreq, which has kilohertz, in megahertz.
TFinding<std::uint32_t> MegahertzIn(TMachineFiles const& files, std::string const& path);

}  // namespace NQRVZEP20
