// SPDX-License-Identifier: Apache-2.0
#include "providers/storage/DriveRecords.h"

#include "tests/providers/storage/MachineTree.h"

namespace NQRVZEP20 {
namespace {

class DriveRecordsTest : public testing::Test {
protected:
  DriveRecordsTest() {
    fTree.AddDisk(fDevice, "sda", "8:0", "2000");
    fTree.Add(fDevice + "/state", "running\n");
    fTree.Add(fDevice + "/model", "Disk\n");
  }

  TDisk Disk() const {
    return DiskOf(fTree.fFiles, BlockDevicesOf(fTree.fFiles).at(0), TUdevRecord(TMissing{kMissingNotGiven, "no udev"}));
  }

  std::string Value(char const* property) const {
    return LineOf(DiskDriveRecord(fTree.fFiles, Disk(), fHealth, TComputerSystem(fTree.fFiles)), property);
  }

  std::string const fDevice = "/sys/devices/pci0000:00/0000:00:1f.2/ata1/host0/target0:0:0/0:0:0:0";
  TMachineTree fTree;
  TSmartReport fHealth = NoSmartReport({kMissingNotGiven, "no smartctl"});
};

TEST_F(DriveRecordsTest, StatesOfTheKernel) {
  struct TRow {
    char const *fState, *fStatus;
  };
  TRow const rows[] = {{"running", "{ 2 }"},          {"live", "{ 2 }"},
                       {"offline", "{ 6 }"},          {"transport-offline", "{ 13 }"},
                       {"deleting (no IO)", "{ 9 }"}, {"asleep", "<the kernel reports the state \"asleep\">"}};
  for (TRow const& row : rows) {
    fTree.Add(fDevice + "/state", std::string(row.fState) + "\n");
    EXPECT_EQ(Value("OperationalStatus"), row.fStatus) << row.fState;
  }
}

TEST_F(DriveRecordsTest, AFailingDiskIsMarked) {
  EXPECT_EQ(Value("HealthState"), "<no smartctl>");
  fHealth.fPassed = true;
  EXPECT_EQ(Value("HealthState"), "5");
  EXPECT_EQ(Value("OperationalStatus"), "{ 2 }");
  fHealth.fPassed = false;
  EXPECT_EQ(Value("HealthState"), "20");
  EXPECT_EQ(Value("OperationalStatus"), "{ 2, 5 }");
  EXPECT_EQ(Value("StatusDescriptions"), "{ running, the disk reports that it is failing }");
}

TEST_F(DriveRecordsTest, AHotDiskIsNotFailing) {
  constexpr unsigned char spare = 1, temperature = 2;
  fHealth.fPassed = false;
  fHealth.fCriticalWarning = temperature;
  EXPECT_EQ(Value("HealthState"), "10");
  EXPECT_EQ(Value("OperationalStatus"), "{ 2 }");
  EXPECT_EQ(Value("StatusDescriptions"), "{ running }");
  fHealth.fCriticalWarning = static_cast<unsigned char>(spare | temperature);
  EXPECT_EQ(Value("HealthState"), "20");
  EXPECT_EQ(Value("OperationalStatus"), "{ 2, 5 }");
}

TEST_F(DriveRecordsTest, RotationAndFormFactorMayComeFromSmartctl) {
  EXPECT_EQ(Value("DiskType"), "2");
  EXPECT_EQ(Value("RPM"), "<no smartctl>");
  fHealth.fRotationsPerMinute = 7200U;
  fHealth.fFormFactor = 3U;
  EXPECT_EQ(Value("RPM"), "7200");
  EXPECT_EQ(Value("FormFactor"), "5");
  fHealth.fRotationsPerMinute = 0U;
  fHealth.fFormFactor = 5U;
  EXPECT_EQ(Value("DiskType"), "3");
  EXPECT_EQ(Value("RPM"), "<this disk does not rotate>");
  EXPECT_EQ(Value("FormFactor"), "1");
}

TEST_F(DriveRecordsTest, SizesAndCapabilities) {
  EXPECT_EQ(Value("MaxMediaSize"), "1024");
  EXPECT_EQ(Value("DefaultBlockSize"), "512");
  EXPECT_EQ(Value("Capabilities"), "{ 3, 4 }");
  fTree.Add(fDevice + "/block/sda/ro", "1\n");
  fTree.Add(fDevice + "/block/sda/removable", "1\n");
  EXPECT_EQ(Value("Capabilities"), "{ 3, 7 }");
}

TEST_F(DriveRecordsTest, PackageAndFirmware) {
  fTree.Add(fDevice + "/rev", "1.0\n");
  fTree.Add(fDevice + "/vendor", "MAKER\n");
  EXPECT_EQ(LineOf(PackageRecord(Disk()), "Model"), "Disk");
  EXPECT_EQ(LineOf(PackageRecord(Disk()), "Manufacturer"), "MAKER");
  EXPECT_EQ(LineOf(FirmwareRecord(Disk()), "VersionString"), "1.0");
  EXPECT_EQ(LineOf(FirmwareRecord(Disk()), "ElementName"), "Firmware of sda");
}

}  // namespace
}  // namespace NQRVZEP20
