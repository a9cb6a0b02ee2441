// SPDX-License-Identifier: Apache-2.0
#include "HostRecords.h"

#include "TCIMSchemaHelper.h"
#include "providers/reasons/RunningClock.h"

#include <algorithm>

namespace NQRVZEP20 {

namespace {

using TText = TFinding<std::string>;

bool IsNumber(std::string const& name) { return name.find_first_not_of("0123456789") == std::string::npos; }

// Each process has a directory in /proc, which a recorded machine lacks.
TFinding<std::uint32_t> NumberOfProcesses(TMachineFiles const& files) {
  auto const names = files.Names("/proc");
  auto const count = std::count_if(names.begin(), names.end(), IsNumber);
  if (count == 0) return TMissing{kMissingNotGiven, "/proc lists no processes"};
  return static_cast<std::uint32_t>(count);
}

TFinding<std::uint64_t> Sum(TFinding<std::uint64_t> const& one, TFinding<std::uint64_t> const& other) {
  return one.Then([&](std::uint64_t first) { return other.Then([first](std::uint64_t second) { return first + second; }); });
}

// In units of 1024 bytes, like the file. The schema calls the memory together with the swap space virtual memory.
void AddMemory(TRecord& record, TMemInfo const& memory) {
  constexpr char const* unit = "byte * 2^10";
  auto const total = memory.Kilobytes("MemTotal"), free = memory.Kilobytes("MemFree");
  auto const swap = memory.Kilobytes("SwapTotal"), freeSwap = memory.Kilobytes("SwapFree");
  record.SetSource("/proc/meminfo");
  record.Add("TotalVisibleMemorySize", total).Unit(unit);
  record.Add("FreePhysicalMemory", free).Unit(unit);
  record.Add("TotalSwapSpaceSize", swap).Unit(unit);
  record.Add("FreeSpaceInPagingFiles", freeSwap).Unit(unit);
  record.Add("TotalVirtualMemorySize", Sum(total, swap)).Unit(unit);
  record.Add("FreeVirtualMemory", Sum(free, freeSwap)).Unit(unit);
}

}  // namespace

TRecord OperatingSystemRecord(TOsRelease const& release, TKernelNames const& kernel, TMemInfo const& memory,
                              TMachineFiles const& files, TSystemName const& name) {
  TRecord record(TCIMSchemaHelper::kOperatingSystemCreationClassName, release.GetFile(), "CIM_OperatingSystem");
  record.AddKey("CSCreationClassName", TCIMSchemaHelper::kSystemCreationClassName);
  record.AddPropagatedKey("CSName", name.fName);
  record.AddKey("CreationClassName", TCIMSchemaHelper::kOperatingSystemCreationClassName);
  record.AddKey("Name", release.Value({"NAME"}));
  record.Add("Caption", release.Value({"PRETTY_NAME"}));
  record.Add("Version", release.Value({"VERSION", "VERSION_ID", "BUILD_ID"}));

  record.SetSource(kernel.fSource);
  record.Add("OSType", kernel.fSystem);
  record.Add("KernelRelease", kernel.fRelease);
  record.Add("KernelVersion", kernel.fVersion);
  record.Add("Architecture", kernel.fArchitecture);

  TRunningClock const clock = RunningClockOf(files);
  record.SetSource("/proc/stat");
  record.Add("LastBootUpTime", clock.fBootTime);
  record.SetSource("/proc/stat, /proc/uptime");
  record.Add("LocalDateTime", clock.fTime);
  record.SetSource("/proc");
  record.Add("NumberOfProcesses", NumberOfProcesses(files));
  AddMemory(record, memory);
  return record;
}

TRecord ProductRecord() {
  TRecord record("QRVSG_ZEPProduct", "this build of zepcore");
  record.AddKey("Name", "zepcore");
  record.AddKey("Version", TText(ZEP_VERSION));
  record.Add("Build", TText(ZEP_BUILD_ID));
  return record;
}

}  // namespace NQRVZEP20
