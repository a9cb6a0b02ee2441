// SPDX-License-Identifier: Apache-2.0
#include "ProcessorInstances.h"

#include "FirmwareRecords.h"
#include "ProcessorRecords.h"
#include "WeaknessRecords.h"
#include "providers/reasons/TRecordWriter.h"

#include <algorithm>

namespace NQRVZEP20 {

namespace {

constexpr TAssociation kCapabilities{"CIM_ElementCapabilities", "ManagedElement", "CIM_ManagedElement", "Capabilities",
                                     "CIM_Capabilities"};
constexpr TAssociation kComponent{"CIM_ConcreteComponent", "GroupComponent", "CIM_ManagedElement", "PartComponent",
                                  "CIM_ManagedElement"};

constexpr char const* kNoneFilled = "the firmware reports every processor socket as empty";

using TSockets = std::vector<TKernelProcessors::TSocket>;

TSockets SocketsOf(TFinding<TKernelProcessors> const& kernel) { return kernel ? kernel->GetSockets() : TSockets(); }

std::vector<TSmbiosStructure> FilledSockets(TSmbiosReader const& tables) {
  std::vector<TSmbiosStructure> filled;
  for (TSmbiosStructure const& structure : tables.All(kSmbiosProcessor))
    if (IsSocketFilled(structure)) filled.push_back(structure);
  return filled;
}

TMissing WhyNoKernelSocket(TFinding<TKernelProcessors> const& kernel) {
  if (!kernel) return kernel.Why();
  return {kMissingNotGiven, "the kernel uses only " + std::to_string(kernel->GetSockets().size()) + " of the processors"};
}

// The kernel's facts about each of `count` processors.
std::vector<TFinding<TProcessorFacts>> FactsOf(TFinding<TKernelProcessors> const& kernel, TMachineFiles const& files,
                                               std::size_t count) {
  std::vector<TFinding<TProcessorFacts>> facts;
  for (auto const& socket : SocketsOf(kernel)) facts.emplace_back(ProcessorFactsOf(socket, files));
  while (facts.size() < count) facts.emplace_back(WhyNoKernelSocket(kernel));
  return facts;
}

void WriteProcessorRecords(THostContext const& host, TProcessorInstances& instances) {
  auto const filled = FilledSockets(host.fTables);
  auto const facts = FactsOf(instances.fKernel, host.fFiles, filled.size());
  TMissing const whyNone = WhyNonePresent(host.fTables, kSmbiosProcessor, kNoneFilled);
  auto const recordOf = [&](unsigned number, TFinding<TProcessorFacts> const& kernel) {
    TSmbiosStructure const structure = number < filled.size() ? filled[number] : TSmbiosStructure(whyNone);
    return ProcessorRecord(structure, host.fTables.SourceOf(kSmbiosProcessor), number, host.fName, kernel);
  };

  for (std::size_t at = 0; at < facts.size(); ++at)
    instances.fProcessors.push_back(recordOf(static_cast<unsigned>(at), facts[at]));
  TRecord const shape =
      instances.fProcessors.empty() ? recordOf(0, WhyNoKernelSocket(instances.fKernel)) : instances.fProcessors.front();
  host.fWriter.Write(shape, instances.fProcessors, whyNone);
  for (TRecord const& processor : instances.fProcessors) host.fWriter.Associate(kSystemDevice, host.fSystem, processor);

  std::vector<TRecord> capabilities;
  for (std::size_t at = 0; at < SocketsOf(instances.fKernel).size(); ++at)
    capabilities.push_back(CapabilitiesRecord(static_cast<unsigned>(at), facts[at]));
  host.fWriter.Write(CapabilitiesRecord(0, WhyNoKernelSocket(instances.fKernel)), capabilities,
                     WhyNoKernelSocket(instances.fKernel));
  for (std::size_t at = 0; at < capabilities.size(); ++at)
    host.fWriter.Associate(kCapabilities, instances.fProcessors[at], capabilities[at]);
}

// The chips that the firmware lists in the sockets, which are matched with the processors in their order.
void WriteChips(THostContext const& host, TProcessorInstances const& instances) {
  auto const filled = FilledSockets(host.fTables);
  std::string const source = host.fTables.SourceOf(kSmbiosProcessor);
  TMissing const whyNone = WhyNonePresent(host.fTables, kSmbiosProcessor, kNoneFilled);
  std::vector<TRecord> chips;
  for (TSmbiosStructure const& structure : filled)
    chips.push_back(ProcessorChipRecord(structure, source, static_cast<unsigned>(chips.size())));
  host.fWriter.Write(ProcessorChipRecord(TSmbiosStructure(whyNone), source, 0), chips, whyNone);
  for (std::size_t at = 0; at < chips.size(); ++at) host.fWriter.Associate(kRealizes, chips[at], instances.fProcessors[at]);
}

void WriteSettings(THostContext const& host, TProcessorInstances const& instances) {
  std::vector<TRecord> settings;
  auto const sockets = SocketsOf(instances.fKernel);
  for (auto const& socket : sockets)
    settings.push_back(ProcessorSettingsRecord(static_cast<unsigned>(settings.size()), &socket, host.fFiles));
  host.fWriter.Write(ProcessorSettingsRecord(0, nullptr, host.fFiles), settings, WhyNoKernelSocket(instances.fKernel));
  for (std::size_t at = 0; at < settings.size(); ++at) host.fWriter.Associate(kSettings, instances.fProcessors[at], settings[at]);
}

void WriteCores(THostContext const& host, TProcessorInstances& instances) {
  std::vector<TRecord> all;
  for (auto const& socket : SocketsOf(instances.fKernel)) {
    std::vector<TRecord> cores;
    for (auto const& core : socket.fCores)
      cores.push_back(CoreRecord(static_cast<unsigned>(instances.fCores.size()), static_cast<unsigned>(cores.size()), core));
    all.insert(all.end(), cores.begin(), cores.end());
    instances.fCores.push_back(cores);
  }
  host.fWriter.Write(CoreRecord(0, 0, {}), all, WhyNoKernelSocket(instances.fKernel));
  for (std::size_t at = 0; at < instances.fCores.size(); ++at)
    for (TRecord const& core : instances.fCores[at]) host.fWriter.Associate(kComponent, instances.fProcessors[at], core);
}

void WriteWeaknesses(THostContext const& host) {
  auto const& files = host.fHardwareFiles;
  TMissing const none{kMissingNoSource, "the kernel lists no weaknesses in /sys/devices/system/cpu/vulnerabilities"};
  host.fWriter.Write(WeaknessRecord("", none), files ? WeaknessRecords(*files) : std::vector<TRecord>(),
                     files ? none : files.Why());
}

}  // namespace

TProcessorInstances WriteProcessors(THostContext const& host) {
  TProcessorInstances instances{host.fHardwareFiles.Then(TKernelProcessors::ReadFrom), {}, {}};
  WriteProcessorRecords(host, instances);
  WriteChips(host, instances);
  WriteSettings(host, instances);
  WriteCores(host, instances);
  WriteWeaknesses(host);
  return instances;
}

}  // namespace NQRVZEP20
