// SPDX-License-Identifier: Apache-2.0
#include "SensorsNamespace.h"

#include "LogRecords.h"
#include "SensorRecords.h"
#include "TMemoryNamespace.h"
#include "providers/reasons/TRecordWriter.h"

namespace NQRVZEP20 {

namespace {

constexpr TAssociation kAssociatedSensor{"CIM_AssociatedSensor", "Antecedent", "CIM_Sensor", "Dependent",
                                         "CIM_ManagedSystemElement"};
constexpr TAssociation kElementStatisticalData{"CIM_ElementStatisticalData", "ManagedElement", "CIM_ManagedElement", "Stats",
                                               "CIM_StatisticalData"};

constexpr TAssociation kUseOfLog{"CIM_UseOfLog", "Antecedent", "CIM_Log", "Dependent", "CIM_ManagedSystemElement"};
constexpr TAssociation kLogManagesRecord{"CIM_LogManagesRecord", "Log", "CIM_Log", "Record", "CIM_RecordForLog"};

using TRecords = std::vector<TRecord>;

TMissing NoneIn(char const* directory, char const* elements) {
  return {kMissingNoSource, std::string("the kernel lists no ") + elements + " in " + directory};
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

void WritePowerSupplies(TRecordWriter& writer, TMachineFiles const& files, TComputerSystem const& system) {
  TRecords supplies;
  for (TPowerSupply const& each : ReadPowerSupplies(files)) supplies.push_back(PowerSupplyRecord(each, system));
  writer.Write(PowerSupplyRecord({}, system), supplies, NoneIn("/sys/class/power_supply", "power supplies"));
  for (TRecord const& record : supplies) writer.Associate(kSystemDevice, system.Record(), record);
}

void WriteKernelLog(TRecordWriter& writer, TMachineFiles const& files, TRecord const& system) {
  auto const log = ReadKernelLog(files);
  TRecords logs, events;
  if (log) logs.push_back(KernelLogRecord(*log));
  if (log && !log->fEvents.empty()) {
    TRunningClock const clock = RunningClockOf(files);  // reading it takes long on a machine with many processors
    for (TKernelEvent const& event : log->fEvents) events.push_back(KernelEventRecord(event, clock));
  }
  writer.Write(KernelLogRecord({}), logs, log ? TMissing{} : log.Why());
  writer.Write(KernelEventRecord({}, {}), events,
               log ? TMissing{kMissingNotGiven, "the log of the kernel reports no error"} : log.Why());
  for (TRecord const& each : logs) writer.Associate(kUseOfLog, each, system);
  for (TRecord const& each : events) writer.Associate(kLogManagesRecord, logs.front(), each);
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
              {kMissingNoSource, "the kernel counts the errors of no PCI Express device"});
  WritePowerSupplies(writer, files, system);
  WriteKernelLog(writer, files, system.Record());
  writer.WriteMissing();
}

}  // namespace NQRVZEP20
