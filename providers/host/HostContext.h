// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TSmbiosReader.h"
#include "TSystemName.h"
#include "providers/reasons/TMachineFiles.h"
#include "providers/reasons/TRecord.h"
#include "providers/reasons/TRecordWriter.h"

#include <string>
#include <vector>

namespace NQRVZEP20 {

// The sources and the writer that the steps share which fill the namespace. Each step writes the instances of one subject.
struct THostContext {
  TRecordWriter& fWriter;
  TSmbiosReader const& fTables;
  TMachineFiles const& fFiles;             // of the running system
  TFinding<TMachineFiles> fHardwareFiles;  // the same files; missing when the tables are those of another machine
  TSystemName fName;
  TRecord fSystem;  // the computer system, as written
};

constexpr TAssociation kSettings{"CIM_ElementSettingData", "ManagedElement", "CIM_ManagedElement", "SettingData",
                                 "CIM_SettingData"};
constexpr TAssociation kRealizes{"CIM_Realizes", "Antecedent", "CIM_PhysicalElement", "Dependent", "CIM_LogicalDevice"};

// An SMBIOS structure and the record that was written for it.
struct TStructureRecord {
  TSmbiosStructure fStructure;
  TRecord fRecord;
};

// The structures of a type that `isPresent`, each with its record. `makeRecord` gets a structure and its number, from 0.
template <class TMakeRecord, class TIsPresent>
std::vector<TStructureRecord> StructureRecords(TSmbiosReader const& tables, int type, TIsPresent isPresent,
                                               TMakeRecord makeRecord) {
  std::vector<TStructureRecord> records;
  for (TSmbiosStructure const& structure : tables.All(type))
    if (isPresent(structure)) records.push_back({structure, makeRecord(structure, static_cast<unsigned>(records.size()))});
  return records;
}

// The reason why no structure of the type is present.
TMissing WhyNonePresent(TSmbiosReader const& tables, int type, std::string const& whyNonePresent);

// Writes a class with these records. `shape`: a record that declares the class when there are none.
void WriteRecords(THostContext const& host, TRecord const& shape, std::vector<TStructureRecord> const& records,
                  TMissing const& whyNone);

// Writes a class with a record of each structure of that type that `isPresent`, and returns the records.
template <class TMakeRecord, class TIsPresent>
std::vector<TStructureRecord> WriteEach(THostContext const& host, int type, TIsPresent isPresent,
                                        std::string const& whyNonePresent, TMakeRecord makeRecord) {
  auto const records = StructureRecords(host.fTables, type, isPresent, makeRecord);
  TMissing const whyNone = WhyNonePresent(host.fTables, type, whyNonePresent);
  WriteRecords(host, makeRecord(TSmbiosStructure(whyNone), 0), records, whyNone);
  return records;
}

// Writes a class with the settings of each of these elements. `whyNone`: why there may be no element.
template <class TMakeRecord>
void WriteSettingsOf(THostContext const& host, std::vector<TStructureRecord> const& elements, TMissing const& whyNone,
                     TMakeRecord makeRecord) {
  std::vector<TRecord> settings;
  for (TStructureRecord const& element : elements)
    settings.push_back(makeRecord(element.fStructure, static_cast<unsigned>(settings.size())));
  host.fWriter.Write(makeRecord(TSmbiosStructure(whyNone), 0), settings, whyNone);
  for (std::size_t at = 0; at < settings.size(); ++at) host.fWriter.Associate(kSettings, elements[at].fRecord, settings[at]);
}

inline bool IsAlwaysPresent(TSmbiosStructure const&) { return true; }

}  // namespace NQRVZEP20
