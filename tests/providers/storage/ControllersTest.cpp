// SPDX-License-Identifier: Apache-2.0
#include "providers/storage/Controllers.h"

#include "tests/providers/storage/MachineTree.h"

namespace NQRVZEP20 {
namespace {

class ControllersTest : public testing::Test {
protected:
  std::vector<TController> Controllers() const {
    std::vector<TDisk> disks;
    for (TBlockDevice const& device : BlockDevicesOf(fTree.fFiles))
      disks.push_back(DiskOf(fTree.fFiles, device, TUdevRecord(TMissing())));
    return ControllersOf(disks);
  }

  TMachineTree fTree;
  std::string const fBridge = "/sys/devices/pci0000:00/0000:00:03.0";
  std::string const fSata = "/sys/devices/pci0000:00/0000:00:1f.2";
};

TEST_F(ControllersTest, DrivesOfTheSameFunctionShareAController) {
  fTree.AddDisk(fSata + "/ata1/host0/target0:0:0/0:0:0:0", "sda", "8:0", "8");
  fTree.AddDisk(fSata + "/ata2/host1/target1:0:0/1:0:0:0", "sdb", "8:16", "8");
  fTree.AddDisk(fBridge + "/0000:01:00.0/nvme/nvme0", "nvme0n1", "259:0", "8");
  fTree.Add(fBridge + "/0000:01:00.0/nvme/nvme0/transport", "pcie\n");
  fTree.AddDisk("/sys/devices/platform/virtio0", "vda", "254:0", "8");
  std::vector<TController> const controllers = Controllers();
  ASSERT_EQ(controllers.size(), 2u);
  EXPECT_EQ(controllers[0].fAddress, "0000:01:00.0");
  EXPECT_TRUE(controllers[0].IsNvme());
  EXPECT_EQ(controllers[1].fAddress, "0000:00:1f.2");
  EXPECT_THAT(controllers[1].fDrives, ElementsAre("sda", "sdb"));
}

TEST_F(ControllersTest, DriverAndNumbers) {
  fTree.Link(fSata + "/driver", "/sys/bus/pci/drivers/ahci");
  fTree.Add("/sys/bus/pci/drivers/ahci/uevent", "");
  fTree.Add(fSata + "/vendor", "0x8086\n");
  fTree.Add(fSata + "/device", "0x2922\n");
  TRecord const record =
      ControllerRecord(fTree.fFiles, {"0000:00:1f.2", fSata, std::string("sata")}, TComputerSystem(fTree.fFiles));
  EXPECT_EQ(LineOf(record, "DeviceID"), "0000:00:1f.2");
  EXPECT_EQ(LineOf(record, "ProtocolSupported"), "48");
  EXPECT_EQ(LineOf(record, "OtherIdentifyingInfo"), "{ ahci, 8086:2922 }");
  EXPECT_EQ(LineOf(record, "IdentifyingDescriptions"), "{ Driver, PCI vendor and device }");
}

TEST_F(ControllersTest, TheSlotIsThatOfTheControllerOrOfABridgeAboveIt) {
  fTree.Add("/sys/bus/pci/slots/7/address", "0000:01:00\n");
  fTree.Add("/sys/bus/pci/slots/7/power", "1\n");
  struct TRow {
    std::string fPath, fSlot;
  };
  TRow const rows[] = {{fBridge + "/0000:01:00.0", "7"},
                       {fBridge + "/0000:01:00.0/0000:02:00.0/0000:03:00.0", "7"},
                       {fSata, "<the kernel lists no slot for the PCI device a>"},
                       {"", "<the kernel lists no slot for the PCI device a>"}};
  for (TRow const& row : rows) EXPECT_EQ(TextOf(SlotOf(fTree.fFiles, {"a", row.fPath})), row.fSlot) << row.fPath;
  EXPECT_THAT(LinesOf(SlotRecord(fTree.fFiles, "7")),
              ElementsAre("Tag=PCI slot 7", "CreationClassName=CIM_Slot", "ElementName=7", "PoweredOn=true"));
}

}  // namespace
}  // namespace NQRVZEP20
