// SPDX-License-Identifier: Apache-2.0

// Reads any text as /proc/cpuinfo, a list of CPUs, the size of a cache, and the output of systemctl.

#include "fuzz/Require.h"
#include "providers/host/CacheRecords.h"
#include "providers/host/CpuInfo.h"
#include "providers/host/CpuList.h"
#include "providers/host/RunningRecords.h"

#include <algorithm>

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  std::string const text(reinterpret_cast<char const*>(data), size);
  for (NQRVZEP20::TCpuInfo const& cpu : NQRVZEP20::ParseCpuInfo(text)) {
    auto const name = cpu.Text("model name");
    Require(!name || !name->empty());
    for (std::string const& flag : cpu.Flags()) Require(cpu.HasFlag(flag));
  }
  auto cpus = NQRVZEP20::CpusIn(text);
  std::sort(cpus.begin(), cpus.end());
  cpus.erase(std::unique(cpus.begin(), cpus.end()), cpus.end());
  Require(NQRVZEP20::CpusIn(NQRVZEP20::CpuListOf(cpus)) == cpus);
  static_cast<void>(NQRVZEP20::CacheSizeFrom(text));
  static_cast<void>(NQRVZEP20::FailedUnitsFrom(text));
  return 0;
}
