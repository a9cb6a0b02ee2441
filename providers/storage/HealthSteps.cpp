// SPDX-License-Identifier: Apache-2.0
#include "Health.h"
#include "TStorage.h"

namespace NQRVZEP20 {

namespace {

constexpr TAssociation kStatistics{"CIM_ElementStatisticalData", "ManagedElement", "CIM_ManagedElement", "Stats",
                                   "CIM_StatisticalData"};

}  // namespace

void WriteHealth(TStorage& storage) {
  std::vector<TRecord> records, attributes;
  std::vector<std::pair<std::string, TRecord>> ofDrives;
  for (TDisk const& disk : storage.fDisks) {
    std::string const& name = disk.fDevice.fName;
    TSmartReport const& report = storage.fHealth.at(name);
    if (!HasHealth(report)) continue;
    records.push_back(HealthRecord(name, report));
    ofDrives.emplace_back(name, records.back());
    for (TSmartAttribute const& attribute : report.fAttributes) {
      attributes.push_back(AttributeRecord(name, attribute));
      ofDrives.emplace_back(name, attributes.back());
    }
  }
  TMissing const noReport{storage.fDisks.empty() ? kMissingNotGiven : kMissingNoSource,
                          "no disk has a report of its health: the property HealthState of each disk has the reason"};
  TMissing const noAttributes{kMissingNoSource, "no disk has a table of SMART attributes that smartctl could read"};
  storage.fWriter.Write(HealthRecord("", NoSmartReport(noReport)), records, noReport);
  storage.fWriter.Write(AttributeRecord("", TSmartAttribute()), attributes, noAttributes);
  for (auto const& [name, record] : ofDrives) storage.fWriter.Associate(kStatistics, storage.fDrives.at(name), record);
}

}  // namespace NQRVZEP20
