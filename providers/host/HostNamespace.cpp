// SPDX-License-Identifier: Apache-2.0
#include "HostNamespace.h"

#include "BoardInstances.h"
#include "BootRecords.h"
#include "FirmwareRecords.h"
#include "HostContext.h"
#include "HostRecords.h"
#include "MemoryInstances.h"
#include "Placeholder.h"
#include "ProcessorInstances.h"
#include "RunningRecords.h"
#include "ScsiRecords.h"
#include "SmbiosRecords.h"
#include "TpmRecords.h"
#include "Virtualization.h"
#include "providers/memory/TMemoryNamespace.h"
#include "providers/reasons/TRecordWriter.h"

namespace NQRVZEP20 {

namespace {

constexpr TAssociation kRunningOS{"CIM_RunningOS", "Antecedent", "CIM_OperatingSystem", "Dependent", "CIM_ComputerSystem"};
constexpr TAssociation kSystemBios{"CIM_SystemBIOS", "GroupComponent", "CIM_ComputerSystem", "PartComponent", "CIM_BIOSElement"};
constexpr TAssociation kSystemPackage{"CIM_ComputerSystemPackage", "Antecedent", "CIM_PhysicalPackage", "Dependent",
                                      "CIM_ComputerSystem"};

constexpr TAssociation kStatistics{"CIM_ElementStatisticalData", "ManagedElement", "CIM_ManagedElement", "Stats",
                                   "CIM_StatisticalData"};

// The strings of the manufacturer and of the system's options, with the kind of each.
TIdentifyingTexts StringsOf(TSmbiosReader const& tables) {
  TIdentifyingTexts texts{tables.SourceOf(kSmbiosOemStrings) + ", " + tables.SourceOf(kSmbiosOptions), {}};
  constexpr struct {
    int fType;
    char const* fKind;
  } kinds[] = {{kSmbiosOemStrings, "OEM string"}, {kSmbiosOptions, "Configuration option"}};
  for (auto const& [type, kind] : kinds)
    for (TSmbiosStructure const& structure : tables.All(type))
      for (std::string const& text : structure.Texts())
        if (auto const found = WithoutPlaceholder(text)) texts.fTexts.emplace_back(kind, *found);
  return texts;
}

// The kernel describes this machine. Tables from a file that the user names may be those of another one, and facts of two
// machines must not be mixed.
TFinding<TMachineFiles> HardwareFiles(TMachineFiles const& files, TSmbiosReader const& tables) {
  if (files.IsThisMachine() && tables.IsOfNamedFile())
    return TMissing{kMissingNotGiven,
                    "the SMBIOS tables are read from a named file, so this machine's own hardware is not described"};
  return files;
}

void WriteOperatingSystem(THostContext const& host, TKernelNames const& kernel) {
  TMemInfo const memory = TMemInfo::ReadFrom(host.fFiles, "/proc/meminfo");
  TRecord const system = OperatingSystemRecord(TOsRelease::ReadFrom(host.fFiles), kernel, memory, host.fFiles, host.fName);
  TRecord const state = RunningRecord(host.fFiles, memory);
  host.fWriter.Write(system);
  host.fWriter.Write(state);
  host.fWriter.Associate(kRunningOS, system, host.fSystem);
  host.fWriter.Associate(kStatistics, system, state);
}

void WriteBios(THostContext const& host) {
  auto const records = WriteEach(host, kSmbiosBios, IsAlwaysPresent, "", [&](TSmbiosStructure const& bios, unsigned number) {
    return BiosRecord(bios, host.fTables.SourceOf(kSmbiosBios), number);
  });
  for (TStructureRecord const& bios : records) host.fWriter.Associate(kSystemBios, host.fSystem, bios.fRecord);
  WriteSettingsOf(host, records, WhyNonePresent(host.fTables, kSmbiosBios, ""),
                  [&](TSmbiosStructure const& bios, unsigned number) {
                    return FirmwareSettingsRecord(bios, host.fTables.SourceOf(kSmbiosBios), number);
                  });
}

std::vector<TStructureRecord> WriteChassis(THostContext const& host) {
  auto const records =
      WriteEach(host, kSmbiosChassis, IsAlwaysPresent, "", [&](TSmbiosStructure const& chassis, unsigned number) {
        return ChassisRecord(chassis, host.fTables.SourceOf(kSmbiosChassis), number);
      });
  for (TStructureRecord const& chassis : records) host.fWriter.Associate(kSystemPackage, chassis.fRecord, host.fSystem);
  WriteSettingsOf(host, records, WhyNonePresent(host.fTables, kSmbiosChassis, ""),
                  [&](TSmbiosStructure const& chassis, unsigned number) {
                    return ChassisStateRecord(chassis, host.fTables.SourceOf(kSmbiosChassis), number);
                  });
  return records;
}

// Writes an instance with the settings of the computer system; none when the hardware is that of another machine.
template <class TMakeRecord>
void WriteSettings(THostContext const& host, TMakeRecord makeRecord) {
  bool const isDescribed = static_cast<bool>(host.fHardwareFiles);
  TRecord const record = makeRecord(host.fFiles);
  host.fWriter.Write(record, isDescribed ? std::vector<TRecord>{record} : std::vector<TRecord>(),
                     isDescribed ? TMissing() : host.fHardwareFiles.Why());
  if (isDescribed) host.fWriter.Associate(kSettings, host.fSystem, record);
}

void WriteFirmware(THostContext const& host, TFinding<TKernelProcessors> const& processors) {
  WriteSettings(host, [&](TMachineFiles const& files) {
    return BootRecord(files, {host.fTables.First(kSmbiosBoot), host.fTables.SourceOf(kSmbiosBoot)},
                      {host.fTables.First(kSmbiosSystem), host.fTables.SourceOf(kSmbiosSystem)});
  });
  WriteSettings(host, [&](TMachineFiles const& files) { return VirtualizationRecord(files, processors); });
}

void WriteTpms(THostContext const& host) {
  auto const& files = host.fHardwareFiles;
  auto const structures = host.fTables.All(kSmbiosTpm);
  TSourcedStructure const absent{
      TSmbiosStructure(WhyNonePresent(host.fTables, kSmbiosTpm, "the SMBIOS tables describe fewer modules than the kernel")),
      host.fTables.SourceOf(kSmbiosTpm)};
  auto const modules = TpmRecords(files, structures, absent, host.fName);
  host.fWriter.Write(TpmShape(absent, host.fName), modules,
                     files ? TMissing{kMissingNotGiven,
                                      "neither the kernel (/sys/class/tpm) nor the SMBIOS tables list a trusted platform module"}
                           : files.Why());
  for (TRecord const& module : modules) host.fWriter.Associate(kSystemDevice, host.fSystem, module);
}

void WriteScsiDevices(THostContext const& host) {
  TScsiPlace const directory = ScsiDirectory(host.fFiles);
  auto const devices = ScsiRecords(directory, host.fName);
  host.fWriter.Write(ScsiShape(host.fName), devices, WhyNoScsiDevices(directory));
  for (TRecord const& device : devices) host.fWriter.Associate(kSystemDevice, host.fSystem, device);
}

}  // namespace

void FillHostNamespace(TMemoryNamespace& ns) {
  TMachineFiles const files = TMachineFiles::OfThisProcess();
  TKernelNames const kernel = KernelNamesOf(files);
  TSystemName const name = SystemNameOf(kernel);
  TSmbiosReader const tables(files);
  TRecord const system = ComputerSystemRecord(tables.First(kSmbiosSystem), tables.SourceOf(kSmbiosSystem), name, tables.Version(),
                                              StringsOf(tables));

  TRecordWriter writer(ns);
  THostContext const host{writer, tables, files, HardwareFiles(files, tables), name, system};
  writer.Write(system);
  WriteOperatingSystem(host, kernel);
  writer.Write(ProductRecord());
  WriteBios(host);
  auto const chassis = WriteChassis(host);
  auto const processors = WriteProcessors(host);
  WriteBoards(host, chassis, WriteMemory(host, processors));
  WriteFirmware(host, processors.fKernel);
  WriteTpms(host);
  WriteScsiDevices(host);
  writer.WriteMissing();
}

}  // namespace NQRVZEP20
