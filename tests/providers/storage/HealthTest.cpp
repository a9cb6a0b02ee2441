// SPDX-License-Identifier: Apache-2.0
#include "providers/storage/Health.h"

#include "tests/providers/storage/MachineTree.h"

namespace NQRVZEP20 {
namespace {

class HealthTest : public testing::Test {
protected:
  void AddDisk(std::string const& device, std::string const& name) { fTree.AddDisk("/sys/devices/" + device, name, "8:0", "8"); }

  std::map<std::string, TSmartReport> Health() const {
    std::vector<TDisk> disks;
    for (TBlockDevice const& device : BlockDevicesOf(fTree.fFiles))
      disks.push_back(DiskOf(fTree.fFiles, device, TUdevRecord(TMissing())));
    return HealthOf(fTree.fFiles, disks);
  }

  TMachineTree fTree;
};

TEST_F(HealthTest, EachDiskHasTheAnswerToItsOwnQuery) {
  for (int i = 0; i < 20; ++i) {
    std::string const number = std::to_string(i), name = "sd" + std::string(1, static_cast<char>('a' + i));
    AddDisk("pci0000:00/0000:00:1f.2/ata1/host0/target0:0:" + number + "/0:0:" + number + ":0", name);
    fTree.Add("/zep-answers/smartctl/" + name, "{\"smart_support\":{},\"power_cycle_count\":" + number + "}");
  }
  std::map<std::string, TSmartReport> const health = Health();
  ASSERT_EQ(health.size(), 20u);
  EXPECT_EQ(TextOf(health.at("sda").fPowerCycles), "0");
  EXPECT_EQ(TextOf(health.at("sdk").fPowerCycles), "10");
  EXPECT_EQ(TextOf(health.at("sdt").fPowerCycles), "19");
}

TEST_F(HealthTest, DrivesWithoutSuchAReportAreNotAsked) {
  AddDisk("pci0000:00/0000:00:04.0/virtio0", "vda");
  AddDisk("platform/floppy.0", "fd0");
  fTree.Add("/zep-answers/smartctl/vda", "{\"smart_support\":{},\"power_cycle_count\":1}");
  std::map<std::string, TSmartReport> const health = Health();
  EXPECT_EQ(TextOf(health.at("vda").fPowerCycles), "<smartctl supports no disks with the transport virtio>");
  EXPECT_EQ(TextOf(health.at("fd0").fPowerCycles), "<this drive is not a disk>");
}

TEST_F(HealthTest, AMissingAnswerIsAReason) {
  AddDisk("pci0000:00/0000:00:04.0/nvme/nvme0", "nvme0n1");
  EXPECT_EQ(TextOf(Health().at("nvme0n1").fPassed), "</zep-answers/smartctl/nvme0n1 does not exist>");
}

TEST_F(HealthTest, ARecordNamesItsDisk) {
  TRecord const record = HealthRecord("nvme0n1", NoSmartReport(TMissing()));
  EXPECT_EQ(LineOf(record, "ElementName"), "Health of nvme0n1");
  EXPECT_EQ(LineOf(record, "Disk"), "nvme0n1");
}

TEST_F(HealthTest, AttributesAreInstances) {
  TSmartAttribute attribute;
  attribute.fId = 5;
  attribute.fName = std::string("Reallocated_Sector_Ct");
  attribute.fRaw = 3UL;
  TRecord const record = AttributeRecord("sda", attribute);
  EXPECT_EQ(LineOf(record, "InstanceID"), "ZEP:smart:sda:5");
  EXPECT_EQ(LineOf(record, "ElementName"), "Reallocated_Sector_Ct");
  EXPECT_EQ(LineOf(record, "RawValue"), "3");
}

}  // namespace
}  // namespace NQRVZEP20
