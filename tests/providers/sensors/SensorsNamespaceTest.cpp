// SPDX-License-Identifier: Apache-2.0
#include "providers/sensors/SensorsNamespace.h"

#include "providers/reasons/TMachineFiles.h"
#include "providers/sensors/LogRecords.h"
#include "tests/Support.h"
#include "tests/providers/NamespaceText.h"

#include <gmock/gmock.h>

#include <filesystem>
#include <map>

namespace NQRVZEP20 {
namespace {

using testing::HasSubstr;

class SensorsNamespaceTest : public testing::Test {
protected:
  void Write(std::string const& path, std::string const& text) const {
    std::filesystem::create_directories(std::filesystem::path(fDir.Path(path)).parent_path());
    WriteFile(fDir.Path(path), text);
  }
  void Fill() { FillSensorsNamespace(TMachineFiles(fDir.Path()), *fNs); }

  TEnvironmentGuard fUnnamed{"ZEP_HOST_NAME", nullptr};
  TTempDir const fDir;
  boost::shared_ptr<TMemoryNamespace> fNs = NewNamespace();
};

TEST_F(SensorsNamespaceTest, ASensorIsTiedToItsFanAndBothToTheSystem) {
  Write("proc/sys/kernel/hostname", "s1\n");
  Write("sys/class/hwmon/hwmon0/name", "board\n");
  Write("sys/class/hwmon/hwmon0/fan1_input", "0\n");
  Write("sys/class/hwmon/hwmon0/fan1_min", "300\n");
  Write("sys/class/hwmon/hwmon0/fan1_label", "CPU fan\n");
  Fill();
  std::string const text = TextOf(*fNs);
  EXPECT_THAT(text, HasSubstr("CurrentState: Lower Non-Critical"));
  EXPECT_THAT(text, HasSubstr("ElementName: CPU fan"));
  EXPECT_THAT(text, HasSubstr("CIM_AssociatedSensor"));
}

TEST_F(SensorsNamespaceTest, ErrorsBelongToTheSystem) {
  Write("sys/devices/system/edac/mc/mc0/ce_noinfo_count", "4\n");
  Write("sys/bus/pci/devices/0000:01:00.0/aer_dev_correctable", "BadTLP 3\nTOTAL_ERR_COR 3\n");
  Fill();
  std::string const text = TextOf(*fNs);
  EXPECT_THAT(text, HasSubstr("CorrectedErrors: 4"));
  EXPECT_THAT(text, HasSubstr("CorrectableErrors: 3"));
  EXPECT_THAT(text, HasSubstr("CIM_ElementStatisticalData"));
}

TEST_F(SensorsNamespaceTest, ErrorsInTheLogBelongToTheLogOfTheSystem) {
  Write("proc/uptime", "100.5 1.0\n");
  Write("proc/stat", "cpu 0\nbtime 1700000000\n");
  Write("dev/kmsg", "3,7,40000001,-;critical medium error, dev sda, sector 4656\n6,8,40000002,-;fine\nunknown form\n");
  Fill();
  std::string const text = TextOf(*fNs);
  EXPECT_THAT(text, HasSubstr("MessageTimestamp=\"20231114221400.000001+000\""));
  EXPECT_THAT(text, HasSubstr("RecordData: critical medium error, dev sda, sector 4656"));
  EXPECT_THAT(text, HasSubstr("Subject: sda"));
  EXPECT_THAT(text, HasSubstr("Age: 60"));
  EXPECT_THAT(text, HasSubstr("CurrentNumberOfRecords: 2"));
  EXPECT_THAT(text, HasSubstr("GoneRecords: 7"));
  EXPECT_THAT(text, HasSubstr("UnreadableRecords: 1"));
  EXPECT_THAT(text, HasSubstr("CIM_LogManagesRecord"));
  EXPECT_THAT(text, HasSubstr("CIM_UseOfLog"));
}

TEST_F(SensorsNamespaceTest, TheTimesOfARecordNameAllTheirSources) {
  std::map<std::string, std::string> sources;
  TRecord const record = KernelEventRecord({}, {});
  for (TRecordProperty const& property : record.GetProperties()) sources[property.fName] = property.fSource;
  EXPECT_EQ(sources["MessageTimestamp"], "/dev/kmsg, /proc/stat");
  EXPECT_EQ(sources["Age"], "/dev/kmsg, /proc/uptime");
  EXPECT_EQ(sources["RecordData"], "/dev/kmsg");
}

TEST_F(SensorsNamespaceTest, ALogWithoutErrorsHasAReasonForNoRecords) {
  Write("dev/kmsg", "6,0,1,-;fine\n");
  Fill();
  TReasonReader const reasons(*fNs);
  EXPECT_EQ(reasons.WhyNoInstance("ZEP_KernelLogRecord")->fReason, "the log of the kernel reports no error");
  EXPECT_THAT(TextOf(*fNs), HasSubstr("CurrentNumberOfRecords: 1"));
}

TEST_F(SensorsNamespaceTest, APowerSupplyHasAState) {
  Write("sys/class/power_supply/PSU1/type", "Mains\n");
  Write("sys/class/power_supply/PSU1/online", "0\n");
  Fill();
  EXPECT_THAT(TextOf(*fNs), HasSubstr("StatusDescriptions: { offline }"));
}

TEST_F(SensorsNamespaceTest, AMachineWithoutFilesHasReasons) {
  Fill();
  TReasonReader const reasons(*fNs);
  EXPECT_EQ(reasons.WhyNoInstance("CIM_NumericSensor")->fReason, "the kernel lists no sensors in /sys/class/hwmon");
  EXPECT_EQ(reasons.WhyNoInstance("CIM_Fan")->fReason, "the kernel lists no fans in /sys/class/hwmon");
  EXPECT_EQ(reasons.WhyNoInstance("ZEP_MemoryErrors")->fReason,
            "the kernel lists no memory controllers in /sys/devices/system/edac/mc");
  EXPECT_EQ(reasons.WhyNoInstance("CIM_PowerSupply")->fReason, "the kernel lists no power supplies in /sys/class/power_supply");
  for (char const* name : {"ZEP_KernelLog", "ZEP_KernelLogRecord"})
    EXPECT_EQ(reasons.WhyNoInstance(name)->fCode, kMissingUnreadable) << name;
  EXPECT_EQ(reasons.WhyNoInstance("ZEP_PCIErrors")->fReason, "the kernel counts the errors of no PCI Express device");
  for (char const* name : {"CIM_NumericSensor", "CIM_Fan", "ZEP_MemoryErrors", "CIM_PowerSupply", "ZEP_PCIErrors"})
    EXPECT_EQ(reasons.WhyNoInstance(name)->fCode, kMissingNoSource) << name << ": no rule about it can be asked";
}

}  // namespace
}  // namespace NQRVZEP20
