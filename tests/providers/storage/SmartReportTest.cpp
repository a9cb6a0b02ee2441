// SPDX-License-Identifier: Apache-2.0
#include "providers/storage/SmartReport.h"

#include "tests/providers/storage/MachineTree.h"

namespace NQRVZEP20 {
namespace {

constexpr char const* kNotReported = "<smartctl does not report it for this disk>";

// The output of smartctl 7.3 in a virtual machine: ata, nvme, scsi, usb.
TSmartReport Recorded(char const* name) {
  return SmartReportFrom(ReadFile(TestDataPath("storage/smartctl/" + std::string(name) + ".json")));
}

std::string WithDisk(std::string const& members) { return "{\"smart_support\":{\"available\":true}," + members + "}"; }

TEST(SmartReportTest, AtaDisk) {
  TSmartReport const report = Recorded("ata");
  EXPECT_EQ(TextOf(report.fPassed), "1");
  EXPECT_EQ(TextOf(report.fTemperature), "31");
  EXPECT_EQ(TextOf(report.fPowerOnHours), "1");
  EXPECT_EQ(TextOf(report.fPowerCycles), "0");
  EXPECT_EQ(TextOf(report.fReallocated), "0");
  EXPECT_EQ(TextOf(report.fSelfTest), "completed without error");
  EXPECT_EQ(TextOf(report.fPending), kNotReported);
  EXPECT_EQ(TextOf(report.fAvailableSpare), kNotReported);
  ASSERT_FALSE(report.fAttributes.empty());
  TSmartAttribute const& first = report.fAttributes[0];
  EXPECT_EQ(first.fId, 1);
  EXPECT_EQ(TextOf(first.fName), "Raw_Read_Error_Rate");
  EXPECT_EQ(TextOf(first.fValue), "100");
  EXPECT_EQ(TextOf(first.fThreshold), "6");
  EXPECT_EQ(TextOf(first.fRaw), "0");
  EXPECT_EQ(TextOf(first.fWhenFailed), "<the attribute has never failed>");
  EXPECT_TRUE(*first.fIsPrefailure);
}

TEST(SmartReportTest, NvmeDisk) {
  TSmartReport const report = Recorded("nvme");
  EXPECT_EQ(TextOf(report.fPassed), "1");
  EXPECT_EQ(TextOf(report.fTemperature), "50");
  EXPECT_EQ(TextOf(report.fBytesRead), "512000");
  EXPECT_EQ(TextOf(report.fBytesWritten), "0");
  EXPECT_EQ(TextOf(report.fCriticalWarning), "0");
  EXPECT_EQ(TextOf(report.fPercentageUsed), "0");
  EXPECT_EQ(TextOf(report.fErrorLogEntries), "0");
  EXPECT_THAT(report.fAttributes, IsEmpty());
}

TEST(SmartReportTest, AScsiDiskWithoutHealthHasReasons) {
  TSmartReport const report = Recorded("scsi");
  EXPECT_EQ(TextOf(report.fPassed), kNotReported);
  EXPECT_EQ(TextOf(report.fTemperature), "<the disk reports 0 degrees, as disks without a sensor do>");
  EXPECT_EQ(TextOf(report.fRotationsPerMinute), "0");
}

TEST(SmartReportTest, TheMessageOfSmartctlIsTheReason) {
  EXPECT_EQ(TextOf(Recorded("usb").fPassed), "<smartctl reports: /dev/sdc: Unknown USB bridge [0x46f4:0x0001 (0x000)]>");
  EXPECT_EQ(TextOf(SmartReportFrom("{\"power_mode\":{\"name\":\"STANDBY\"}}").fPassed), "<the disk is in the mode STANDBY>");
  EXPECT_EQ(TextOf(SmartReportFrom("{}").fPassed), "<smartctl reports nothing about the health of this disk>");
}

TEST(SmartReportTest, SasDisk) {
  TSmartReport const report = SmartReportFrom(
      WithDisk("\"scsi_grown_defect_list\":7,\"scsi_percentage_used_endurance_indicator\":12,\"rotation_rate\":10500,"
               "\"form_factor\":{\"scsi_value\":3},\"scsi_error_counter_log\":{\"read\":{\"total_uncorrected_errors\":2},"
               "\"verify\":{\"total_uncorrected_errors\":3}},\"scsi_self_test_0\":{\"result\":{\"string\":\"Completed\"}}"));
  EXPECT_EQ(TextOf(report.fReallocated), "7");
  EXPECT_EQ(TextOf(report.fPercentageUsed), "12");
  EXPECT_EQ(TextOf(report.fUncorrectable), "5");
  EXPECT_EQ(TextOf(report.fRotationsPerMinute), "10500");
  EXPECT_EQ(TextOf(report.fFormFactor), "3");
  EXPECT_EQ(TextOf(report.fSelfTest), "Completed");
}

TEST(SmartReportTest, DeviceStatisticsOfAtaDisks) {
  TSmartReport const report = SmartReportFrom(WithDisk(
      "\"logical_block_size\":512,\"ata_device_statistics\":{\"pages\":[{\"table\":[{\"name\":\"Logical Sectors Written\","
      "\"value\":1000},{\"name\":\"Percentage Used Endurance Indicator\",\"value\":300}]}]}"));
  EXPECT_EQ(TextOf(report.fBytesWritten), "512000");
  EXPECT_EQ(TextOf(report.fPercentageUsed), "255");
}

TEST(SmartReportTest, NumbersOutsideOfTheirRangeAreNotValues) {
  TSmartReport const report = SmartReportFrom(WithDisk(
      "\"power_cycle_count\":-1,\"temperature\":{\"current\":-5},\"nvme_smart_health_information_log\":{\"available_spare\":300,"
      "\"data_units_read\":18446744073709551615,\"critical_warning\":\"x\",\"percentage_used\":1.5}"));
  EXPECT_EQ(TextOf(report.fPowerCycles), "<smartctl reports -1, which is outside the expected range>");
  EXPECT_EQ(TextOf(report.fTemperature), "-5");
  EXPECT_EQ(TextOf(report.fAvailableSpare), "<smartctl reports 300, which is outside the expected range>");
  EXPECT_EQ(TextOf(report.fBytesRead), "<smartctl reports too large a number>");
  EXPECT_EQ(TextOf(report.fCriticalWarning), kNotReported);
  EXPECT_EQ(TextOf(report.fPercentageUsed), kNotReported);
}

TEST(SmartReportTest, OtherTextsAreNotReports) {
  for (char const* text : {"", "null", "[]", "5", "{", "smartctl: command not found"})
    EXPECT_EQ(TextOf(SmartReportFrom(text).fPassed), "<the output of smartctl is not an object in JSON>") << text;
}

}  // namespace
}  // namespace NQRVZEP20
