// SPDX-License-Identifier: Apache-2.0
#include "providers/sensors/SensorsNamespace.h"

#include "providers/reasons/TMachineFiles.h"
#include "tests/Support.h"
#include "tests/providers/NamespaceText.h"

#include <gmock/gmock.h>

#include <filesystem>

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

TEST_F(SensorsNamespaceTest, AMachineWithoutFilesHasReasons) {
  Fill();
  TReasonReader const reasons(*fNs);
  EXPECT_EQ(reasons.WhyNoInstance("CIM_NumericSensor")->fReason, "the kernel lists no sensors in /sys/class/hwmon");
  EXPECT_EQ(reasons.WhyNoInstance("CIM_Fan")->fReason, "the kernel lists no fans in /sys/class/hwmon");
  EXPECT_EQ(reasons.WhyNoInstance("ZEP_MemoryErrors")->fReason,
            "the kernel lists no memory controllers in /sys/devices/system/edac/mc");
  EXPECT_EQ(reasons.WhyNoInstance("ZEP_PCIErrors")->fReason, "the kernel counts the errors of no PCI Express device");
}

}  // namespace
}  // namespace NQRVZEP20
