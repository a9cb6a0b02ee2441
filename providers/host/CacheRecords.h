// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TKernelProcessors.h"
#include "TSystemName.h"
#include "providers/reasons/TRecord.h"

#include <cstdint>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// A cache of the processors.
struct TCache {
  std::string fName;  // "L1d 0": the kind, and the number within it
  unsigned fLevel;
  std::string fType;  // "Data", "Instruction" or "Unified"
  std::vector<unsigned> fCpus;
  TFinding<std::uint64_t> fBytes;
  TFinding<std::uint32_t> fLineSize;  // in bytes
  TFinding<std::uint32_t> fWays;
};

// Each cache once, however many CPUs share it, sorted by its first CPU. A cache without a level or its list of CPUs in sysfs is
// left out.
std::vector<TCache> CachesOf(TKernelProcessors const& processors, TMachineFiles const& files);

// An instance of CIM_Memory. All records of that class have the properties of MemoryExtentRecord.
TRecord CacheRecord(TCache const& cache, TSystemName const& name);

// The further properties of CIM_AssociatedCacheMemory.
TRecord CacheUse(TCache const& cache);

// A size in a form such as "32K", in bytes.
TFinding<std::uint64_t> CacheSizeFrom(std::string const& text);

}  // namespace NQRVZEP20
