// SPDX-License-Identifier: Apache-2.0
#include "HostNamespace.h"

#include "HostRecords.h"
#include "ScsiRecords.h"
#include "SmbiosRecords.h"
#include "TSmbiosReader.h"
#include "providers/memory/TMemoryNamespace.h"
#include "providers/reasons/TRecordWriter.h"

#include <sys/utsname.h>

namespace NQRVZEP20 {

namespace {

utsname Kernel() {
  utsname kernel = {};
  ::uname(&kernel);
  return kernel;
}

// Writes a class with a record of each structure of that type that is `isPresent`. `makeRecord` gets a structure and its number.
template <class TMakeRecord, class TIsPresent>
void WriteEach(TRecordWriter& writer, TSmbiosReader const& tables, int type, TIsPresent isPresent,
               std::string const& whyNoneIsPresent, TMakeRecord makeRecord) {
  std::vector<TSmbiosStructure> const structures = tables.All(type);
  std::vector<TRecord> records;
  for (TSmbiosStructure const& structure : structures)
    if (isPresent(structure)) records.push_back(makeRecord(structure, static_cast<unsigned>(records.size())));

  TMissing const whyNone = structures.empty() ? tables.WhyNone(type) : TMissing{kMissingNotGiven, whyNoneIsPresent};
  writer.Write(makeRecord(TSmbiosStructure(whyNone), 0), records, whyNone);
}

bool Always(TSmbiosStructure const&) { return true; }

}  // namespace

void FillHostNamespace(TMemoryNamespace& ns) {
  TRecordWriter writer(ns);

  utsname const kernel = Kernel();
  TSystemName const name = SystemNameOf(kernel);
  TSmbiosReader const tables;
  writer.Write(ComputerSystemRecord(tables.First(kSmbiosSystem), tables.SourceOf(kSmbiosSystem), name, tables.Version()));
  writer.Write(OperatingSystemRecord(TOsRelease::OfThisMachine(), kernel, name));
  writer.Write(ProductRecord());

  WriteEach(writer, tables, kSmbiosBios, Always, "", [&](TSmbiosStructure const& bios, unsigned number) {
    return BiosRecord(bios, tables.SourceOf(kSmbiosBios), number);
  });
  WriteEach(writer, tables, kSmbiosChassis, Always, "", [&](TSmbiosStructure const& chassis, unsigned number) {
    return ChassisRecord(chassis, tables.SourceOf(kSmbiosChassis), number);
  });
  WriteEach(writer, tables, kSmbiosProcessor, IsSocketFilled, "the firmware reports every processor socket as empty",
            [&](TSmbiosStructure const& processor, unsigned number) {
              return ProcessorRecord(processor, tables.SourceOf(kSmbiosProcessor), number, name);
            });
  WriteEach(writer, tables, kSmbiosMemoryDevice, IsSlotFilled, "the firmware reports every memory slot as empty",
            [&](TSmbiosStructure const& memoryDevice, unsigned number) {
              return MemoryRecord(memoryDevice, tables.SourceOf(kSmbiosMemoryDevice), number);
            });

  std::string const scsi = ScsiDirectory();
  writer.Write(ScsiShape(name), ScsiRecords(scsi, name), WhyNoScsiDevices(scsi));
  writer.WriteMissing();
}

}  // namespace NQRVZEP20
