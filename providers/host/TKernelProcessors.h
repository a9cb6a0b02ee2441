// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "CpuInfo.h"
#include "providers/reasons/TMachineFiles.h"

#include <memory>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// The processors as the kernel sees them: sockets, their cores, and the logical CPUs of the cores. It lists only CPUs that are
// online.
//
// Several threads may read the same object.
class TKernelProcessors {
public:
  struct TCore {
    std::vector<unsigned> fCpus;  // the hardware threads, in ascending order; never empty
  };
  struct TSocket {
    std::vector<TCore> fCores;  // never empty
    TCpuInfo fInfo;             // of its first CPU

    unsigned FirstCpu() const { return fCores.front().fCpus.front(); }
    std::vector<unsigned> Cpus() const;  // in ascending order
  };

  // Reads /proc/cpuinfo and the topology in /sys/devices/system/cpu. Missing when /proc/cpuinfo cannot be read or lists no CPU.
  static TFinding<TKernelProcessors> ReadFrom(TMachineFiles const& files);

  std::vector<TSocket> const& GetSockets() const { return fSockets; }

private:
  TKernelProcessors() = default;

  std::shared_ptr<std::string const> fText;  // of /proc/cpuinfo, to which the sockets refer
  std::vector<TSocket> fSockets;
};

// The directory with the files of a logical CPU, with a slash at the end.
std::string CpuDirectory(unsigned cpu);

}  // namespace NQRVZEP20
