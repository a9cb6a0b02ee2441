// SPDX-License-Identifier: Apache-2.0
#include "providers/storage/Attachment.h"

#include "tests/providers/storage/MachineTree.h"

namespace NQRVZEP20 {
namespace {

class AttachmentTest : public testing::Test {
protected:
  // "transport | speed | PCI function | SCSI address" of the only device.
  std::string Attachment() const {
    std::vector<TBlockDevice> const devices = BlockDevicesOf(fTree.fFiles);
    if (devices.size() != 1) return "not one device";
    TAttachment const attachment = AttachmentOf(fTree.fFiles, devices[0]);
    return TextOf(attachment.fTransport) + " | " + TextOf(attachment.fSpeed) + " | " + TextOf(attachment.fPciPath) + " | " +
           TextOf(attachment.ScsiAddress());
  }

  TMachineTree fTree;
  std::string const fPci = "/sys/devices/pci0000:00/0000:00:1f.2";
};

TEST_F(AttachmentTest, Sata) {
  fTree.AddDisk(fPci + "/ata3/host2/target2:0:0/2:0:0:0", "sda", "8:0", "8");
  fTree.Add("/sys/class/ata_link/link3/sata_spd", "6.0 Gbps\n");
  EXPECT_EQ(Attachment(), "sata | 6000000000 | " + fPci + " | 2:0:0:0");
}

TEST_F(AttachmentTest, ParallelAtaHasNoSataSpeed) {
  fTree.AddDisk(fPci + "/ata3/host2/target2:0:0/2:0:0:0", "sda", "8:0", "8");
  fTree.Add("/sys/class/ata_link/link3/sata_spd", "<unknown>\n");
  EXPECT_EQ(Attachment(), "ata | <sysfs gives no link speed for the transport ata> | " + fPci + " | 2:0:0:0");
}

TEST_F(AttachmentTest, Sas) {
  std::string const port = fPci + "/host0/port-0:1";
  fTree.AddDisk(port + "/end_device-0:1/target0:0:1/0:0:1:0", "sda", "8:0", "8");
  fTree.Add(port + "/phy-0:1/uevent", "");
  fTree.Add("/sys/class/sas_phy/phy-0:1/negotiated_linkrate", "12.0 Gbit\n");
  EXPECT_EQ(Attachment(), "sas | 12000000000 | " + fPci + " | 0:0:1:0");
}

TEST_F(AttachmentTest, UsbSpeedIsThatOfTheDevice) {
  std::string const usb = fPci + "/usb2/2-1";
  fTree.AddDisk(usb + "/2-1:1.0/host6/target6:0:0/6:0:0:0", "sda", "8:0", "8");
  fTree.Add(usb + "/busnum", "2\n");
  fTree.Add(usb + "/speed", "480\n");
  EXPECT_EQ(Attachment(), "usb | 480000000 | " + fPci + " | 6:0:0:0");
}

TEST_F(AttachmentTest, NvmeSpeedIsThatOfAllLanes) {
  fTree.AddDisk(fPci + "/nvme/nvme0", "nvme0n1", "259:0", "8");
  fTree.Add(fPci + "/nvme/nvme0/transport", "pcie\n");
  fTree.Add(fPci + "/current_link_speed", "8.0 GT/s PCIe\n");
  fTree.Add(fPci + "/current_link_width", "4\n");
  EXPECT_EQ(Attachment(), "nvme | 32000000000 | " + fPci + " | <this is not a SCSI device>");
}

TEST_F(AttachmentTest, ASharedNvmeDiskIsReachedThroughTheFirstController) {
  std::string const subsystem = "/sys/devices/virtual/nvme-subsystem/nvme-subsys0";
  fTree.AddBlockDevice(subsystem + "/nvme0n1", "259:0", "8");
  fTree.Link(subsystem + "/nvme0n1/device", subsystem);
  fTree.Link(subsystem + "/nvme1", fPci + "/nvme/nvme1");
  fTree.Add(fPci + "/nvme/nvme1/transport", "pcie\n");
  EXPECT_EQ(Attachment(), "nvme | <" + fPci + "/current_link_speed does not exist> | " + fPci + " | <this is not a SCSI device>");
}

TEST_F(AttachmentTest, VirtualDisksAndCards) {
  struct TRow {
    char const *fDevice, *fName, *fTransport;
  };
  TRow const rows[] = {{"/virtio1", "vda", "virtio"},
                       {"/mmc_host/mmc0/mmc0:0001", "mmcblk0", "mmc"},
                       {"/virtio2/host2/target2:0:0/2:0:0:0", "sda", "virtio"},
                       {"/host3/rport-3:0-1/target3:0:0/3:0:0:0", "sda", "fc"},
                       {"/host4/session1/target4:0:0/4:0:0:0", "sda", "iscsi"}};
  for (TRow const& row : rows) {
    TMachineTree tree;
    tree.AddDisk(fPci + row.fDevice, row.fName, "8:0", "8");
    TAttachment const attachment = AttachmentOf(tree.fFiles, BlockDevicesOf(tree.fFiles).at(0));
    EXPECT_EQ(TextOf(attachment.fTransport), row.fTransport) << row.fDevice;
  }
}

TEST_F(AttachmentTest, WithoutPciThereIsAReason) {
  fTree.AddDisk("/sys/devices/platform/x/virtio0", "vda", "254:0", "8");
  EXPECT_EQ(Attachment(),
            "virtio | <sysfs gives no link speed for the transport virtio> | <the drive is not attached through PCI: its path is "
            "/sys/devices/platform/x/virtio0> | <this is not a SCSI device>");
}

TEST_F(AttachmentTest, AnUnknownTransportIsNamed) {
  fTree.AddDisk(fPci + "/host0/target0:0:0/0:0:0:0", "sda", "8:0", "8");
  EXPECT_THAT(Attachment(), HasSubstr("<sysfs does not show by which transport sda is attached> | "));
  fTree.Add("/sys/class/spi_host/host0/uevent", "");
  EXPECT_THAT(Attachment(), HasSubstr("spi | "));
}

TEST(SpeedTest, Speeds) {
  struct TRow {
    char const *fText, *fSpeed;
  };
  TRow const rows[] = {{"6.0 Gbps", "6000000000"},
                       {"1.5 Gbps", "1500000000"},
                       {"16 Gbit", "16000000000"},
                       {"2.5 GT/s PCIe", "2500000000"},
                       {"480", "480000000"},
                       {"1.5", "1500000"},
                       {"10 Mbps", "10000000"},
                       {"<unknown>", "<f contains \"<unknown>\", which is not a speed>"},
                       {"Unknown", "<f contains \"Unknown\", which is not a speed>"},
                       {"-1", "<f contains \"-1\", which is not a speed>"},
                       {"0", "<f contains \"0\", which is not a speed>"},
                       {"nan", "<f contains \"nan\", which is not a speed>"},
                       {"inf", "<f contains \"inf\", which is not a speed>"},
                       {"1e300 Gbps", "<f contains \"1e300 Gbps\", which is not a speed>"},
                       {"5 apples", "<f contains \"5 apples\", which is not a speed>"},
                       {"", "<f contains \"\", which is not a speed>"}};
  for (TRow const& row : rows) EXPECT_EQ(TextOf(SpeedFrom(row.fText, "f")), row.fSpeed);
}

TEST(PciAddressTest, Addresses) {
  EXPECT_TRUE(IsPciAddress("0000:00:1f.2"));
  for (char const* text : {"", "0000:00:1f", "0000:00:1f.22", "0000-00:1f.2", "000g:00:1f.2"})
    EXPECT_FALSE(IsPciAddress(text)) << text;
}

}  // namespace
}  // namespace NQRVZEP20
