// SPDX-License-Identifier: Apache-2.0
#include "providers/storage/VolumeRecords.h"

#include "tests/providers/storage/MachineTree.h"

namespace NQRVZEP20 {
namespace {

TEST(VolumeRecordsTest, NamesOfLvmVolumes) {
  struct TRow {
    char const *fName, *fUuid, *fText;
  };
  TRow const rows[] = {
      {"vg0-root", "LVM-abc", "vg0/root"}, {"a--b-c--d", "LVM-abc", "a-b/c-d"},       {"vg-lv-real", "LVM-abc", "vg/lv-real"},
      {"vg0-root", "", "vg0-root"},        {"luks--x", "CRYPT-LUKS2-abc", "luks--x"}, {"", "LVM-abc", ""},
  };
  for (TRow const& row : rows) EXPECT_EQ(MappedNameFrom(row.fName, row.fUuid), row.fText);
}

class MappedVolumeTest : public testing::Test {
protected:
  MappedVolumeTest() {
    fTree.AddBlockDevice(fPath, "253:0", "2048");
    fTree.Add(fPath + "/dm/name", "mpatha\n");
    fTree.Add(fPath + "/dm/uuid", "mpath-3600\n");
    fTree.Add(fPath + "/dm/suspended", "0\n");
    for (char const* name : {"sda", "sdb"}) {
      fTree.Add(fPath + "/slaves/" + name + "/dev", "8:0\n");
      fTree.Add("/sys/class/block/" + std::string(name) + "/device/state", "running\n");
    }
  }

  std::string Value(char const* property) const {
    TBlockDevice device;
    device.fName = "dm-0";
    device.fPath = fPath;
    device.fKind = TBlockDevice::kMapped;
    return LineOf(MappedVolumeRecord(fTree.fFiles, device, TComputerSystem(fTree.fFiles)), property);
  }

  std::string const fPath = "/sys/devices/virtual/block/dm-0";
  TMachineTree fTree;
};

TEST_F(MappedVolumeTest, AVolumeWhosePathsWorkIsOK) {
  EXPECT_EQ(Value("ElementName"), "mpatha");
  EXPECT_EQ(Value("OtherIdentifyingInfo"), "{ mpatha, mpath-3600 }");
  EXPECT_EQ(Value("OperationalStatus"), "{ 2 }");
  EXPECT_EQ(Value("StatusDescriptions"), "{ active }");
}

TEST_F(MappedVolumeTest, AMultipathDeviceThatLostAPathIsDegraded) {
  fTree.Add("/sys/class/block/sdb/device/state", "offline\n");
  EXPECT_EQ(Value("OperationalStatus"), "{ 3 }");
  EXPECT_EQ(Value("StatusDescriptions"), "{ 1 of 2 paths cannot be used }");
}

TEST_F(MappedVolumeTest, ASuspendedVolumeIsStopped) {
  fTree.Add(fPath + "/dm/suspended", "1\n");
  EXPECT_EQ(Value("OperationalStatus"), "{ 10 }");
}

}  // namespace
}  // namespace NQRVZEP20
