// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TFinding.h"
#include "providers/reasons/TMachineFiles.h"

#include <cstdint>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// The errors that the kernel has counted in a memory module, or in a memory controller outside of its modules (EDAC).
struct TMemoryErrors {
  std::string fName;                             // "mc0 dimm3"; "mc0" for a controller
  TFinding<std::string> fLabel = TMissing{};     // of the module: "CPU0_DIMM_A1"
  TFinding<std::string> fLocation = TMissing{};  // "channel 0 slot 1"
  TFinding<std::uint64_t> fCorrected = TMissing{}, fUncorrected = TMissing{};
};

// Of every memory controller, each followed by its modules. The counts of a controller are those that the kernel could not
// assign to a module.
std::vector<TMemoryErrors> ReadMemoryErrors(TMachineFiles const& files);

// The errors that the kernel has counted at a PCI Express function (AER).
struct TPciErrors {
  std::string fAddress;  // "0000:01:00.0"
  TFinding<std::uint64_t> fCorrectable = TMissing{}, fNonFatal = TMissing{}, fFatal = TMissing{};
  TFinding<std::vector<std::string>> fKinds = TMissing{};  // those that have occurred, with their numbers: "BadTLP 3"
};

// Of every function whose errors the kernel counts.
std::vector<TPciErrors> ReadPciErrors(TMachineFiles const& files);

// The counters in a file such as aer_dev_correctable: lines of a name and a number. The last one is the total.
struct TAerCounters {
  std::uint64_t fTotal = 0;
  std::vector<std::string> fOccurred;  // "BadTLP 3"
};
TFinding<TAerCounters> AerCountersFrom(std::string const& text);

}  // namespace NQRVZEP20
