// SPDX-License-Identifier: Apache-2.0
#include "providers/reasons/TComputerSystem.h"

#include "tests/Support.h"

namespace NQRVZEP20 {
namespace {

class TComputerSystemTest : public testing::Test {
protected:
  void SetUp() override { std::filesystem::create_directories(fDir.Path("proc/sys/kernel")); }
  void SetHostName(std::string const& name) const { WriteFile(fDir.Path("proc/sys/kernel/hostname"), name); }
  TComputerSystem System() const { return TComputerSystem(TMachineFiles(fDir.Path())); }

  // "Name=value" of each key; a missing value is its reason in angle brackets.
  static std::string KeysOf(TRecord const& record) {
    std::string text;
    for (TRecordProperty const& property : record.GetProperties()) {
      EXPECT_TRUE(property.fIsKey) << property.fName;
      std::string const value = property.fValue.IsNull() ? "<" + property.fMissing.fReason + ">" : property.fValue.ToString();
      text += (text.empty() ? "" : ",") + property.fName + "=" + value;
    }
    return text;
  }

  TTempDir fDir;
  TEnvironmentGuard fUnnamed{"ZEP_HOST_NAME", nullptr};
};

TEST_F(TComputerSystemTest, TheNameIsTheKernels) {
  SetHostName("db1\n");
  EXPECT_EQ(KeysOf(System().Record()), "CreationClassName=CIM_ComputerSystem,Name=db1");
  EXPECT_EQ(System().Record().GetProperties().back().fSource, "/proc/sys/kernel/hostname");
}

TEST_F(TComputerSystemTest, TheEnvironmentMayNameTheSystem) {
  SetHostName("db1\n");
  TEnvironmentGuard const named("ZEP_HOST_NAME", "db2");
  EXPECT_EQ(KeysOf(System().Record()), "CreationClassName=CIM_ComputerSystem,Name=db2");
  EXPECT_EQ(System().Record().GetProperties().back().fSource, "ZEP_HOST_NAME");
}

TEST_F(TComputerSystemTest, AMissingNameHasAReason) {
  EXPECT_EQ(KeysOf(System().Record()), "CreationClassName=CIM_ComputerSystem,Name=</proc/sys/kernel/hostname does not exist>");
  SetHostName("(none)\n");
  EXPECT_EQ(KeysOf(System().Record()),
            "CreationClassName=CIM_ComputerSystem,Name=<no host name is set: the kernel reports \"(none)\">");
}

TEST_F(TComputerSystemTest, ADeviceHasTheKeysOfItsSystem) {
  SetHostName("db1\n");
  TRecord disk("CIM_DiskDrive", "sysfs");
  System().AddDeviceKeys(disk, "sda");
  EXPECT_EQ(KeysOf(disk),
            "SystemCreationClassName=CIM_ComputerSystem,SystemName=db1,CreationClassName=CIM_DiskDrive,DeviceID=sda");
}

TEST_F(TComputerSystemTest, AHostedElementHasAName) {
  SetHostName("db1\n");
  TRecord endpoint("CIM_LANEndpoint", "sysfs");
  System().AddHostedKeys(endpoint, "eth0");
  EXPECT_EQ(KeysOf(endpoint),
            "SystemCreationClassName=CIM_ComputerSystem,SystemName=db1,CreationClassName=CIM_LANEndpoint,Name=eth0");
}

}  // namespace
}  // namespace NQRVZEP20
