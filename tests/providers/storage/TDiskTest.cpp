// SPDX-License-Identifier: Apache-2.0
#include "providers/storage/TDisk.h"

#include "tests/providers/storage/MachineTree.h"

namespace NQRVZEP20 {
namespace {

using namespace std::string_literals;

class TDiskTest : public testing::Test {
protected:
  // "vendor | model | serial number | firmware" of the only disk.
  std::string Identity() const {
    TDisk const disk = Disk();
    return TextOf(disk.fVendor) + " | " + TextOf(disk.fModel) + " | " + TextOf(disk.fSerialNumber) + " | " +
           TextOf(disk.fFirmware);
  }

  std::vector<std::string> Designators() const {
    std::vector<std::string> texts;
    for (TDesignator const& designator : Disk().fDesignators) texts.push_back(designator.fFormat + " " + designator.fText);
    return texts;
  }

  TDisk Disk() const {
    TBlockDevice const device = BlockDevicesOf(fTree.fFiles).at(0);
    return DiskOf(fTree.fFiles, device, TUdevRecord::Of(fTree.fFiles, NumberOf(fTree.fFiles, device)));
  }

  void AddScsi(std::string const& device) {
    fTree.AddDisk(device, "sda", "8:0", "8");
    fTree.Add(device + "/vendor", "ATA     \n");
    fTree.Add(device + "/model", "Disk            \n");
    fTree.Add(device + "/rev", "1.0 \n");
    fTree.Add(device + "/state", "running\n");
  }

  TMachineTree fTree;
  std::string const fPci = "/sys/devices/pci0000:00/0000:00:1f.2";
  std::string const fScsi = fPci + "/host0/target0:0:0/0:0:0:0";
};

TEST_F(TDiskTest, AScsiDiskReportsItsInquiryAndPages) {
  AddScsi(fScsi);
  fTree.Add(fScsi + "/vpd_pg80", "\0\x80\0\x04"s + "S1  ");
  fTree.Add(fScsi + "/vpd_pg83",
            "\0\x83\0\x18"s + "\x02\x01\0\x08"s + "VENDOR 1" + "\x01\x03\0\x08\x50\0\xc5\0\x12\x34\x56\x78"s);
  fTree.Add(fScsi + "/vpd_pgb1", "\0\xb1\0\x04\x1c\x20\0\x02"s);
  EXPECT_EQ(Identity(), "ATA | Disk | S1 | 1.0");
  EXPECT_THAT(Designators(), ElementsAre("NAA 5000c50012345678", "T10 vendor ID VENDOR 1"));
  EXPECT_EQ(TextOf(Disk().fState), "running");
  EXPECT_EQ(TextOf(Disk().fRotationsPerMinute), "7200");
  EXPECT_EQ(TextOf(Disk().fFormFactor), "2");
}

TEST_F(TDiskTest, AnAtaDiskReportsItsWholeModel) {
  AddScsi(fScsi);
  fTree.Add("/run/udev/data/b8:0",
            "E:ID_ATA=1\nE:ID_MODEL_ENC=A\\x20Disk\\x20with\\x20a\\x20long\\x20name\\x20\\x20\nE:ID_REVISION=1.0.12345\n"
            "E:ID_SERIAL_SHORT=S2\nE:ID_WWN_WITH_EXTENSION=0x5000c50012345678\n");
  EXPECT_EQ(Identity(), "<an ATA disk reports its maker only as part of its model> | A Disk with a long name | S2 | 1.0.12345");
  EXPECT_THAT(Designators(), ElementsAre("NAA 5000c50012345678"));
}

TEST_F(TDiskTest, AUsbDiskHasTheSerialNumberOfItsUsbDevice) {
  AddScsi(fPci + "/usb1/1-1/1-1:1.0/host0/target0:0:0/0:0:0:0");
  fTree.Add(fPci + "/usb1/1-1/busnum", "1\n");
  fTree.Add(fPci + "/usb1/1-1/serial", "U1\n");
  EXPECT_EQ(Identity(), "ATA | Disk | U1 | 1.0");
}

TEST_F(TDiskTest, NvmeDisk) {
  std::string const controller = fPci + "/nvme/nvme0";
  fTree.AddDisk(controller, "nvme0n1", "259:0", "8");
  fTree.Add(controller + "/transport", "pcie\n");
  fTree.Add(controller + "/model", "NVMe Disk   \n");
  fTree.Add(controller + "/serial", "N1   \n");
  fTree.Add(controller + "/firmware_rev", "2.0   \n");
  fTree.Add(controller + "/state", "live\n");
  fTree.Add(controller + "/block/nvme0n1/wwid", "eui.0001020304050607\n");
  EXPECT_EQ(Identity(), "<an NVMe disk reports its maker only as part of its model> | NVMe Disk | N1 | 2.0");
  EXPECT_THAT(Designators(), ElementsAre("EUI64 0001020304050607"));
  EXPECT_EQ(TextOf(Disk().fRotationsPerMinute), "0");
}

TEST_F(TDiskTest, MemoryCard) {
  std::string const card = fPci + "/mmc_host/mmc0/mmc0:0001";
  fTree.AddDisk(card, "mmcblk0", "179:0", "8");
  fTree.Add(card + "/type", "SD\n");
  fTree.Add(card + "/name", "SU16G\n");
  fTree.Add(card + "/serial", "0x1234\n");
  fTree.Add(card + "/fwrev", "0x0\n");
  fTree.Add(card + "/manfid", "0x000003\n");
  EXPECT_EQ(Identity(), "<the card reports its maker only as the number 0x000003> | SU16G | 0x1234 | 0x0");
  EXPECT_EQ(TextOf(Disk().fAttachment.fTransport), "sd");
}

TEST_F(TDiskTest, AVirtioDiskHasOnlyASerialNumber) {
  fTree.AddDisk(fPci + "/virtio0", "vda", "254:0", "8");
  fTree.Add(fPci + "/virtio0/block/vda/serial", "V1");
  EXPECT_EQ(Identity(),
            "<neither the drive nor the kernel reports the maker> | </run/udev/data/b254:0 does not exist> | V1 | <neither the "
            "drive nor the kernel reports the firmware version>");
}

TEST_F(TDiskTest, HostileTextsAreKeptAsTheyAre) {
  AddScsi(fScsi);
  fTree.Add(fScsi + "/model", "\x1b[31m<b>\"\\ \n");
  EXPECT_EQ(TextOf(Disk().fModel), "\x1b[31m<b>\"\\");
}

TEST_F(TDiskTest, AMissingDeviceHasReasonsOnly) {
  TDisk const disk = DiskOf(fTree.fFiles, TBlockDevice(), TUdevRecord(TMissing()));
  EXPECT_EQ(TextOf(disk.fModel), "<neither the drive nor the kernel reports the model>");
  EXPECT_EQ(TextOf(disk.fAttachment.fTransport), "</sys/devices/none/none/device does not exist>");
}

}  // namespace
}  // namespace NQRVZEP20
