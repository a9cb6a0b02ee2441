// SPDX-License-Identifier: Apache-2.0
#include "SensorsNamespace.h"

#include "SensorRecords.h"
#include "TMemoryNamespace.h"
#include "providers/reasons/TRecordWriter.h"

namespace NQRVZEP20 {

namespace {

constexpr TAssociation kAssociatedSensor{"CIM_AssociatedSensor", "Antecedent", "CIM_Sensor", "Dependent",
                                         "CIM_ManagedSystemElement"};
constexpr TAssociation kElementStatisticalData{"CIM_ElementStatisticalData", "ManagedElement", "CIM_ManagedElement", "Stats",
                                               "CIM_StatisticalData"};

using TRecords = std::vector<TRecord>;

TMissing NoneIn(char const* directory, char const* elements) {
  return {kMissingNotGiven, std::string("the kernel lists no ") + elements + " in " + directory};
}

void WriteSensors(TRecordWriter& writer, TMachineFiles const& files, TComputerSystem const& system) {
  TSensor const shape;
  auto const sensors = ReadSensors(files);
  TRecords records, fans;
  for (TSensor const& sensor : sensors) {
    records.push_back(SensorRecord(sensor, system));
    if (sensor.fKind == TSensor::EKind::kFan) fans.push_back(FanRecord(sensor, system));
  }
  writer.Write(SensorRecord(shape, system), records, NoneIn("/sys/class/hwmon", "sensors"));
  writer.Write(FanRecord(shape, system), fans, NoneIn("/sys/class/hwmon", "fans"));

  auto fan = fans.begin();
  for (std::size_t i = 0; i < sensors.size(); ++i) {
    writer.Associate(kSystemDevice, system.Record(), records[i]);
    if (sensors[i].fKind != TSensor::EKind::kFan) continue;
    writer.Associate(kSystemDevice, system.Record(), *fan);
    writer.Associate(kAssociatedSensor, records[i], *fan);
    ++fan;
  }
}

template <class TErrors, class TMakeRecord>
void WriteErrors(TRecordWriter& writer, TRecord const& system, std::vector<TErrors> const& errors, TMakeRecord const& makeRecord,
                 TMissing const& whyNone) {
  TRecords records;
  for (TErrors const& each : errors) records.push_back(makeRecord(each));
  writer.Write(makeRecord(TErrors()), records, whyNone);
  for (TRecord const& record : records) writer.Associate(kElementStatisticalData, system, record);
}

}  // namespace

void FillSensorsNamespace(TMachineFiles const& files, TMemoryNamespace& ns) {
  TComputerSystem const system(files);
  TRecordWriter writer(ns);
  writer.Write(system.Record());
  WriteSensors(writer, files, system);
  WriteErrors(writer, system.Record(), ReadMemoryErrors(files), MemoryErrorsRecord,
              NoneIn("/sys/devices/system/edac/mc", "memory controllers"));
  WriteErrors(writer, system.Record(), ReadPciErrors(files), PciErrorsRecord,
              {kMissingNotGiven, "the kernel counts the errors of no PCI Express device"});
  writer.WriteMissing();
}

}  // namespace NQRVZEP20
