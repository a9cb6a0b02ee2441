// SPDX-License-Identifier: Apache-2.0
#include "collect/stored/UsualChanges.h"

#include "tests/Support.h"

namespace NQRVZEP20 {
namespace {

TStoredInstance InstanceWith(std::string const& cls, std::string const& name, std::string const& value,
                             std::string const& hysteresis) {
  TStoredInstance instance{"root/x:" + cls, "Host", "root/x", cls, {{name, "string", false, value, value, "", "", {}}}};
  if (!hysteresis.empty()) instance.fProperties.push_back({"Hysteresis", "uint32", false, hysteresis, hysteresis, "", "", {}});
  return instance;
}

TEST(UsualChangesTest, TimesLoadTrafficAndReadingsChangeByThemselves) {
  struct {
    char const *fClass, *fProperty, *fBefore, *fAfter, *fHysteresis;
    bool fIsUsual;
  } const rows[] = {
      {"ZEP_RunningState", "Uptime", "1", "2", "", true},
      {"ZEP_RunningState", "LoadOfOneMinute", "1", "2", "", true},
      {"CIM_OperatingSystem", "FreePhysicalMemory", "1", "2", "", true},
      {"ZEP_InterfaceStatistics", "BytesReceived", "1", "2", "", true},
      {"ZEP_InterfaceStatistics", "ReceiveErrors", "1", "2", "", false},
      {"CIM_NumericSensor", "CurrentReading", "40", "44", "", true},
      {"CIM_NumericSensor", "CurrentReading", "40", "45", "", false},
      {"CIM_NumericSensor", "CurrentReading", "40", "42", "2", true},
      {"CIM_NumericSensor", "CurrentReading", "40", "43", "2", false},
      {"CIM_NumericSensor", "CurrentState", "1", "2", "", false},
      {"ZEP_IPAddress", "ValidLifetime", "100", "40", "", true},
      {"ZEP_DiskHealth", "BytesWritten", "1", "2", "", true},
      {"ZEP_DiskHealth", "Temperature", "40", "41", "", true},
      {"ZEP_DiskHealth", "Temperature", "40", "50", "", false},
      {"ZEP_DiskHealth", "ReallocatedSectors", "1", "2", "", false},
      {"ZEP_SmartAttribute", "RawValue", "1", "2", "", true},
      {"ZEP_SmartAttribute", "WhenFailed", "1", "2", "", false},
      {"ZEP_KernelLog", "CurrentNumberOfRecords", "1", "2", "", true},
      {"ZEP_SwapArea", "Used", "1", "2", "", true},
      {"ZEP_SwapArea", "Size", "1", "2", "", false},
      {"ZEP_RaidArray", "Progress", "1", "2", "", true},
      {"ZEP_RaidArray", "FailedMembers", "1", "2", "", false},
      {"CIM_OperatingSystem", "SizeStoredInPagingFiles", "1", "2", "", false},
      {"ZEP_KernelLogRecord", "Age", "1", "9973", "", true},
      {"ZEP_EventLogEntry", "Age", "1", "9973", "", true},
      {"ZEP_KernelLogRecord", "RecordData", "1", "2", "", false},
      {"QRVSG_OperatingSystem", "LastBootUpTime", "20261123040506.000000+000", "20261123040516.000000+000", "", true},
      {"QRVSG_OperatingSystem", "LastBootUpTime", "20261123040506.000000+000", "20261123040517.000000+000", "", false},
      {"QRVSG_OperatingSystem", "LastBootUpTime", "20261123040506.000000+000", "none", "", false},
  };
  for (auto const& row : rows) {
    TStoredInstance const before = InstanceWith(row.fClass, row.fProperty, row.fBefore, row.fHysteresis),
                          after = InstanceWith(row.fClass, row.fProperty, row.fAfter, row.fHysteresis);
    EXPECT_EQ(IsUsualChange(before, after, row.fProperty), row.fIsUsual) << row.fProperty << " " << row.fAfter;
    EXPECT_EQ(IsUsualChange(after, before, row.fProperty), row.fIsUsual) << row.fProperty << " " << row.fAfter << ", reversed";
  }
}

TEST(UsualChangesTest, AReadingThatBecomesUnknownIsAChange) {
  TStoredInstance const before = InstanceWith("CIM_NumericSensor", "CurrentReading", "40", "");
  TStoredInstance after = before;
  after.fProperties[0].fMissing = {"not-given", "the sensor is off"};
  EXPECT_FALSE(IsUsualChange(before, after, "CurrentReading"));
}

TEST(UsualChangesTest, OnlyARecordOfTheKernelIsFoundWithoutItsPath) {
  TStoredInstance record = InstanceWith("ZEP_KernelLogRecord", "RecordID", "812", "");
  EXPECT_EQ(LastingPath(record), "root/x:ZEP_KernelLogRecord,812");
  record.fProperties.push_back({"RecordData", "string", false, "I/O error", "I/O error", "", "", {}});
  EXPECT_EQ(LastingPath(record), "root/x:ZEP_KernelLogRecord,812,I/O error");
  EXPECT_EQ(LastingPath(InstanceWith("CIM_Chassis", "RecordID", "812", "")), "root/x:CIM_Chassis");
}

}  // namespace
}  // namespace NQRVZEP20
