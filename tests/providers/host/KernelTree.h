// SPDX-License-Identifier: Apache-2.0
#pragma once

// Files of the kernel about processors, in the form in which a server has them.

#include "tests/Support.h"

#include <string>

namespace NQRVZEP20 {

class TKernelTree {
public:
  explicit TKernelTree(std::string root) : fRoot(std::move(root)) {}

  // Writes a file below the root, with a line end.
  void Write(std::string const& path, std::string const& text) const {
    std::filesystem::create_directories(std::filesystem::path(fRoot + path).parent_path());
    WriteFile(fRoot + path, text + "\n");
  }

  // Sockets with cores and hardware threads. The first threads of all cores have the lowest numbers, as on x86.
  void Sockets(unsigned sockets, unsigned cores, unsigned threads) const {
    unsigned const allCores = sockets * cores;
    std::string cpuInfo;
    for (unsigned cpu = 0; cpu < allCores * threads; ++cpu) {
      unsigned const core = cpu % allCores, socket = core / cores;
      cpuInfo += "processor\t: " + std::to_string(cpu) +
                 "\nvendor_id\t: ExampleWorks\nmodel name\t: Example P2400\nstepping\t: 2\n" +
                 "cpu MHz\t\t: 2400.123\nphysical id\t: " + std::to_string(socket) +
                 "\nmicrocode\t: 0x2b000603\nflags\t\t: fpu lm ht\n\n";
      std::string const siblings = Siblings(core, allCores, threads);
      Write(Directory(cpu) + "topology/core_cpus_list", siblings);
      Cache(cpu, 0, 1, "Data", "48K", 12, siblings);
      Cache(cpu, 1, 1, "Instruction", "32K", 8, siblings);
      Cache(cpu, 2, 2, "Unified", "2048K", 16, siblings);
      Cache(cpu, 3, 3, "Unified", "61440K", 12, SocketCpus(socket, cores, allCores, threads));
    }
    Write("/proc/cpuinfo", cpuInfo);
  }

private:
  static std::string Directory(unsigned cpu) { return "/sys/devices/system/cpu/cpu" + std::to_string(cpu) + "/"; }

  static std::string Siblings(unsigned core, unsigned allCores, unsigned threads) {
    std::string list = std::to_string(core);
    for (unsigned thread = 1; thread < threads; ++thread) list += "," + std::to_string(core + thread * allCores);
    return list;
  }

  static std::string SocketCpus(unsigned socket, unsigned cores, unsigned allCores, unsigned threads) {
    std::string list;
    for (unsigned thread = 0; thread < threads; ++thread) {
      unsigned const first = socket * cores + thread * allCores;
      list += (list.empty() ? "" : ",") + std::to_string(first) + "-" + std::to_string(first + cores - 1);
    }
    return list;
  }

  void Cache(unsigned cpu, unsigned index, unsigned level, char const* type, char const* size, unsigned ways,
             std::string const& cpus) const {
    std::string const directory = Directory(cpu) + "cache/index" + std::to_string(index) + "/";
    Write(directory + "level", std::to_string(level));
    Write(directory + "type", type);
    Write(directory + "size", size);
    Write(directory + "coherency_line_size", "64");
    Write(directory + "ways_of_associativity", std::to_string(ways));
    Write(directory + "shared_cpu_list", cpus);
  }

  std::string fRoot;
};

}  // namespace NQRVZEP20
