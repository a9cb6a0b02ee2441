// SPDX-License-Identifier: Apache-2.0
#include "TKernelProcessors.h"

#include "CpuList.h"

#include <algorithm>
#include <map>
#include <set>

namespace NQRVZEP20 {

namespace {

constexpr char const* kCpuInfo = "/proc/cpuinfo";
constexpr std::size_t kLongestCpuInfo = std::size_t(16) << 20;

using TText = TFinding<std::string>;

// The socket's number, as text. Without one in /proc/cpuinfo or sysfs, as on some ARM machines, all CPUs are in one socket.
std::string PackageOf(TCpuInfo const& cpu, TMachineFiles const& files) {
  if (auto const package = cpu.Text("physical id")) return *package;
  auto const package = files.Line(CpuDirectory(cpu.GetNumber()) + "topology/physical_package_id");
  return package ? *package : "0";
}

// The hardware threads of the core of this CPU, which is itself among them.
std::vector<unsigned> ThreadsOf(unsigned cpu, TMachineFiles const& files) {
  for (char const* name : {"topology/core_cpus_list", "topology/thread_siblings_list"}) {
    auto const list = files.Line(CpuDirectory(cpu) + name);
    auto const cpus = list ? CpusIn(*list) : std::vector<unsigned>();
    if (std::find(cpus.begin(), cpus.end(), cpu) != cpus.end()) return cpus;
  }
  return {cpu};
}

// Sorts the CPUs into cores. The files of only one thread of each core are read, because a machine may have hundreds.
std::vector<TKernelProcessors::TCore> CoresOf(std::vector<unsigned> const& cpus, TMachineFiles const& files) {
  std::set<unsigned> remaining(cpus.begin(), cpus.end());
  std::vector<TKernelProcessors::TCore> cores;
  while (!remaining.empty()) {
    TKernelProcessors::TCore core;
    for (unsigned cpu : ThreadsOf(*remaining.begin(), files))
      if (remaining.erase(cpu) > 0) core.fCpus.push_back(cpu);
    cores.push_back(core);
  }
  return cores;
}

bool IsLowerNumber(std::string const& a, std::string const& b) { return a.size() != b.size() ? a.size() < b.size() : a < b; }

}  // namespace

std::string CpuDirectory(unsigned cpu) { return "/sys/devices/system/cpu/cpu" + std::to_string(cpu) + "/"; }

std::vector<unsigned> TKernelProcessors::TSocket::Cpus() const {
  std::vector<unsigned> cpus;
  for (TCore const& core : fCores) cpus.insert(cpus.end(), core.fCpus.begin(), core.fCpus.end());
  std::sort(cpus.begin(), cpus.end());
  return cpus;
}

TFinding<TKernelProcessors> TKernelProcessors::ReadFrom(TMachineFiles const& files) {
  auto const text = files.Content(kCpuInfo, kLongestCpuInfo);
  if (!text) return text.Why();

  TKernelProcessors processors;
  processors.fText = std::make_shared<std::string const>(*text);
  std::map<std::string, std::vector<TCpuInfo>, decltype(&IsLowerNumber)> packages(IsLowerNumber);
  for (TCpuInfo const& cpu : ParseCpuInfo(*processors.fText)) packages[PackageOf(cpu, files)].push_back(cpu);
  if (packages.empty()) return TMissing{kMissingNotGiven, std::string(kCpuInfo) + " lists no CPU"};

  for (auto const& [name, infos] : packages) {
    std::vector<unsigned> cpus;
    for (TCpuInfo const& info : infos) cpus.push_back(info.GetNumber());
    processors.fSockets.push_back({CoresOf(cpus, files), infos.front()});
  }
  return processors;
}

}  // namespace NQRVZEP20
