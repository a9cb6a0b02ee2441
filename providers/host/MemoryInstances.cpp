// SPDX-License-Identifier: Apache-2.0
#include "MemoryInstances.h"

#include "CacheRecords.h"
#include "FirmwareRecords.h"
#include "MemoryTotals.h"
#include "NumaRecords.h"
#include "ProcessorInstances.h"
#include "SmbiosRecords.h"
#include "providers/reasons/TRecordWriter.h"

#include <algorithm>
#include <map>
#include <optional>

namespace NQRVZEP20 {

namespace {

constexpr TAssociation kCacheMemory{"CIM_AssociatedCacheMemory", "Antecedent", "CIM_Memory", "Dependent", "CIM_LogicalElement"};
constexpr TAssociation kProcessorMemory{"CIM_AssociatedProcessorMemory", "Antecedent", "CIM_Memory", "Dependent",
                                        "CIM_Processor"};

constexpr char const* kNoneFilled = "the firmware reports every memory slot as empty";

// The socket and the core of each CPU.
using TPlaces = std::map<unsigned, std::pair<std::size_t, std::size_t>>;

TPlaces PlacesOf(TKernelProcessors const& processors) {
  TPlaces places;
  auto const& sockets = processors.GetSockets();
  for (std::size_t socket = 0; socket < sockets.size(); ++socket)
    for (std::size_t core = 0; core < sockets[socket].fCores.size(); ++core)
      for (unsigned cpu : sockets[socket].fCores[core].fCpus) places[cpu] = {socket, core};
  return places;
}

// The sockets of these CPUs, in ascending order.
std::vector<std::size_t> SocketsOf(std::vector<unsigned> const& cpus, TPlaces const& places) {
  std::vector<std::size_t> sockets;
  for (unsigned cpu : cpus)
    if (auto const place = places.find(cpu); place != places.end()) sockets.push_back(place->second.first);
  std::sort(sockets.begin(), sockets.end());
  sockets.erase(std::unique(sockets.begin(), sockets.end()), sockets.end());
  return sockets;
}

// The only core that has these CPUs; null when they belong to several.
TRecord const* OnlyCore(std::vector<unsigned> const& cpus, TPlaces const& places, TProcessorInstances const& processors) {
  std::optional<std::pair<std::size_t, std::size_t>> only;
  for (unsigned cpu : cpus) {
    auto const place = places.find(cpu);
    if (place == places.end()) continue;
    if (only && *only != place->second) return nullptr;
    only = place->second;
  }
  return only ? &processors.fCores[only->first][only->second] : nullptr;
}

// A cache belongs to its core, or to the processors whose cores share it.
void TieCache(THostContext const& host, TCache const& cache, TRecord const& record, TPlaces const& places,
              TProcessorInstances const& processors) {
  if (TRecord const* const core = OnlyCore(cache.fCpus, places, processors))
    return host.fWriter.Associate(kCacheMemory, record, *core, CacheUse(cache));
  for (std::size_t socket : SocketsOf(cache.fCpus, places))
    host.fWriter.Associate(kCacheMemory, record, processors.fProcessors[socket], CacheUse(cache));
}

void WriteNodes(THostContext const& host, TPlaces const& places, TProcessorInstances const& processors) {
  auto const& files = host.fHardwareFiles;
  auto const nodes = files ? NumaNodes(*files, host.fName) : std::vector<TNumaNode>();
  std::vector<TRecord> records;
  for (TNumaNode const& node : nodes) records.push_back(node.fRecord);
  host.fWriter.Write(
      NumaShape(host.fName), records,
      files ? TMissing{kMissingNotGiven, "the kernel lists no NUMA nodes in /sys/devices/system/node"} : files.Why());
  for (TNumaNode const& node : nodes) {
    host.fWriter.Associate(kSystemDevice, host.fSystem, node.fRecord);
    for (std::size_t socket : SocketsOf(node.fCpus, places))
      host.fWriter.Associate(kProcessorMemory, node.fRecord, processors.fProcessors[socket]);
  }
}

// The structure of the memory array to which a module belongs.
TSmbiosStructure ArrayOf(TSmbiosStructure const& module, TSmbiosReader const& tables) {
  auto const arrayHandle = module.Word(0x04);
  for (TSmbiosStructure const& array : tables.All(kSmbiosMemoryArray))
    if (auto const handle = array.Handle(); arrayHandle && handle && *handle == *arrayHandle) return array;
  return TSmbiosStructure(arrayHandle ? TMissing{kMissingNotGiven, "the SMBIOS tables contain no array with the module's handle"}
                                      : arrayHandle.Why());
}

void WriteModuleSettings(THostContext const& host, std::vector<TStructureRecord> const& modules) {
  WriteSettingsOf(host, modules, WhyNonePresent(host.fTables, kSmbiosMemoryDevice, kNoneFilled),
                  [&](TSmbiosStructure const& module, unsigned number) {
                    return ModuleSettingsRecord(module, ArrayOf(module, host.fTables), host.fTables.SourceOf(kSmbiosMemoryDevice),
                                                number);
                  });
}

// The main memory and the caches, which are of one class. Returns the record of the main memory, if it is known.
std::optional<TRecord> WriteMemories(THostContext const& host, TPlaces const& places, TProcessorInstances const& processors) {
  auto const& files = host.fHardwareFiles;
  TRecord const shape = MainMemoryRecord(TMemInfo("", files ? TMissing() : files.Why()), host.fName);
  std::vector<TRecord> records;
  if (files) records.push_back(MainMemoryRecord(TMemInfo::ReadFrom(*files, "/proc/meminfo"), host.fName));
  auto const caches = processors.fKernel ? CachesOf(*processors.fKernel, host.fFiles) : std::vector<TCache>();
  for (TCache const& cache : caches) records.push_back(CacheRecord(cache, host.fName));

  host.fWriter.Write(records.empty() ? shape : records.front(), records, files ? TMissing() : files.Why());
  if (files) host.fWriter.Associate(kSystemDevice, host.fSystem, records.front());
  for (std::size_t at = 0; at < caches.size(); ++at) TieCache(host, caches[at], records[at + 1], places, processors);
  return files ? std::optional(records.front()) : std::nullopt;
}

}  // namespace

std::vector<TStructureRecord> WriteMemory(THostContext const& host, TProcessorInstances const& processors) {
  TPlaces const places = processors.fKernel ? PlacesOf(*processors.fKernel) : TPlaces();
  auto const modules =
      WriteEach(host, kSmbiosMemoryDevice, IsSlotFilled, kNoneFilled, [&](TSmbiosStructure const& memoryDevice, unsigned number) {
        return MemoryRecord(memoryDevice, host.fTables.SourceOf(kSmbiosMemoryDevice), number);
      });
  WriteModuleSettings(host, modules);
  auto const mainMemory = WriteMemories(host, places, processors);
  if (mainMemory)
    for (TStructureRecord const& module : modules) host.fWriter.Associate(kRealizes, module.fRecord, *mainMemory);
  WriteNodes(host, places, processors);
  return modules;
}

}  // namespace NQRVZEP20
