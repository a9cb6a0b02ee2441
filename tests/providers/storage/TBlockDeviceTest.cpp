// SPDX-License-Identifier: Apache-2.0
#include "providers/storage/TBlockDevice.h"

#include "tests/providers/storage/MachineTree.h"

namespace NQRVZEP20 {
namespace {

constexpr char const* kKinds[] = {"disk", "optical", "diskette", "tape", "partition", "array", "mapped", "other"};

class TBlockDeviceTest : public testing::Test {
protected:
  // "name kind" of each device; for a partition also the device that it is part of.
  std::vector<std::string> Devices() const {
    std::vector<std::string> texts;
    for (TBlockDevice const& device : BlockDevicesOf(fTree.fFiles))
      texts.push_back(device.fName + " " + kKinds[device.fKind] + (device.fWhole.empty() ? "" : " of " + device.fWhole));
    return texts;
  }

  TMachineTree fTree;
  std::string const fScsi = "/sys/devices/pci0000:00/0000:00:01.1/ata1/host0/target0:0:0/0:0:0:0";
};

TEST_F(TBlockDeviceTest, EachKindIsRecognised) {
  fTree.AddDisk(fScsi, "sda", "8:0", "2048");
  fTree.AddPartition(fScsi + "/block/sda", "sda1", "8:1", "1", "1000");
  fTree.AddDisk("/sys/devices/pci0000:00/0000:00:01.2/host1/target1:0:0/1:0:0:0", "sr0", "11:0", "0");
  fTree.Add("/sys/devices/pci0000:00/0000:00:01.2/host1/target1:0:0/1:0:0:0/type", "5\n");
  fTree.AddDisk("/sys/devices/platform/floppy.0", "fd0", "2:0", "8");
  fTree.AddBlockDevice("/sys/devices/virtual/block/md0", "9:0", "512");
  fTree.Add("/sys/devices/virtual/block/md0/md/array_state", "clean\n");
  fTree.AddBlockDevice("/sys/devices/virtual/block/dm-0", "253:0", "512");
  fTree.Add("/sys/devices/virtual/block/dm-0/dm/name", "root\n");
  fTree.AddBlockDevice("/sys/devices/virtual/block/loop0", "7:0", "512");
  EXPECT_THAT(Devices(), ElementsAre("dm-0 mapped", "fd0 diskette", "loop0 other", "md0 array", "sda disk",
                                     "sda1 partition of sda", "sr0 optical"));
}

TEST_F(TBlockDeviceTest, DevicesThatAreNotSetUpAreOmitted) {
  fTree.AddBlockDevice("/sys/devices/virtual/block/loop0", "7:0", "0");
  fTree.AddBlockDevice("/sys/devices/virtual/block/md127", "9:127", "0");
  fTree.Add("/sys/devices/virtual/block/md127/md/array_state", "clear\n");
  EXPECT_THAT(Devices(), IsEmpty());
}

TEST_F(TBlockDeviceTest, HiddenPathsAreOmitted) {
  std::string const controller = "/sys/devices/pci0000:00/0000:00:04.0/nvme/nvme0";
  fTree.AddDisk(controller, "nvme0c0n1", "0:0", "100");
  fTree.Add(controller + "/block/nvme0c0n1/hidden", "1\n");
  EXPECT_THAT(Devices(), IsEmpty());
}

TEST_F(TBlockDeviceTest, BootAreasOfMemoryCardsAreNotDisks) {
  std::string const card = "/sys/devices/platform/mmc/mmc0/mmc0:0001";
  fTree.AddDisk(card, "mmcblk0", "179:0", "100");
  fTree.AddBlockDevice(card + "/block/mmcblk0/mmcblk0boot0", "179:8", "8");
  fTree.Link(card + "/block/mmcblk0/mmcblk0boot0/device", card + "/block/mmcblk0");
  EXPECT_THAT(Devices(), ElementsAre("mmcblk0 disk", "mmcblk0boot0 other"));
}

TEST_F(TBlockDeviceTest, ADeviceThatVanishedIsOmitted) {
  fTree.Link("/sys/class/block/sdz", "/sys/devices/gone/block/sdz");
  EXPECT_THAT(Devices(), IsEmpty());
}

TEST_F(TBlockDeviceTest, AMachineWithoutSysfsHasNoDevices) {
  EXPECT_THAT(Devices(), IsEmpty());
  EXPECT_THAT(TapeDrivesOf(fTree.fFiles), IsEmpty());
}

TEST_F(TBlockDeviceTest, ATapeDriveIsListedOnce) {
  for (char const* name : {"st0", "st0a", "nst0", "st0m"}) {
    fTree.Add("/sys/devices/tape/scsi_tape/" + std::string(name) + "/dev", "9:0\n");
    fTree.Link("/sys/class/scsi_tape/" + std::string(name), "/sys/devices/tape/scsi_tape/" + std::string(name));
  }
  std::vector<TBlockDevice> const drives = TapeDrivesOf(fTree.fFiles);
  ASSERT_EQ(drives.size(), 1u);
  EXPECT_EQ(drives[0].fName, "st0");
  EXPECT_EQ(drives[0].fKind, TBlockDevice::kTape);
}

TEST_F(TBlockDeviceTest, ASlashOfANodeIsAnExclamationMarkInSysfs) {
  TBlockDevice device;
  device.fName = "cciss!c0d0";
  EXPECT_EQ(device.Node(), "/dev/cciss/c0d0");
}

TEST_F(TBlockDeviceTest, SizesAreInBytes) {
  fTree.AddDisk(fScsi, "sda", "8:0", "2048");
  fTree.AddDisk("/sys/devices/platform/floppy.0", "fd0", "2:0", "0");
  fTree.AddDisk("/sys/devices/platform/floppy.1", "fd1", "2:1", "8");
  std::vector<TBlockDevice> const devices = BlockDevicesOf(fTree.fFiles);
  ASSERT_EQ(devices.size(), 3u);
  EXPECT_EQ(TextOf(SizeOf(fTree.fFiles, devices[0])),
            "</sys/devices/platform/floppy.0/block/fd0/size is 0: the drive has no medium>");
  EXPECT_EQ(TextOf(SizeOf(fTree.fFiles, devices[1])),
            "<the kernel does not know the size of the medium, and whether there is one, before a program opens the drive>");
  EXPECT_EQ(TextOf(SizeOf(fTree.fFiles, devices[2])), "1048576");
}

}  // namespace
}  // namespace NQRVZEP20
