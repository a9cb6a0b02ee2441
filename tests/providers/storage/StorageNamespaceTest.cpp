// SPDX-License-Identifier: Apache-2.0
#include "providers/storage/StorageNamespace.h"

#include "tests/Machines.h"
#include "tests/providers/storage/MachineTree.h"
#include "tests/providers/storage/NamespaceText.h"

namespace NQRVZEP20 {
namespace {

class StorageNamespaceTest : public testing::Test {
protected:
  void Fill() { FillStorageNamespace(*fNs, fTree.fFiles); }

  // The instances of the class and its subclasses, by the values of a property.
  std::vector<std::string> Values(char const* className, char const* property) const {
    std::vector<std::string> values;
    for (auto const& instance : All(*fNs->GetClass(className, kNone), &ICIMClass::EnumerateInstances))
      values.push_back(instance->GetProperty(property, kNone)->GetValue(kNone).ToString());
    return values;
  }

  std::vector<std::string> ReasonsForNoInstance() const {
    std::vector<std::string> classes;
    for (auto const& instance : All(*fNs->GetClass("ZEP_MissingValue", kNone), &ICIMClass::EnumerateInstances))
      if (instance->GetProperty("ElementProperty", kNone)->GetValue(kNone).ToString().empty())
        classes.push_back(instance->GetProperty("ElementPath", kNone)->GetValue(kNone).ToString());
    return classes;
  }

  boost::shared_ptr<TMemoryNamespace> const fNs = NewNamespace();
  TMachineTree fTree;
};

TEST_F(StorageNamespaceTest, AMachineWithoutSysfsHasReasonsForEveryClass) {
  Fill();
  EXPECT_THAT(
      ReasonsForNoInstance(),
      ElementsAre("CIM_DiskDrive", "CIM_CDROMDrive", "CIM_DisketteDrive", "CIM_TapeDrive", "CIM_PhysicalPackage",
                  "CIM_SoftwareIdentity", "CIM_PCIController", "CIM_Slot", "ZEP_DiskHealth", "ZEP_SmartAttribute",
                  "CIM_StorageExtent", "CIM_GenericDiskPartition", "CIM_DiskPartition", "CIM_GPTDiskPartition", "CIM_LogicalDisk",
                  "CIM_StorageVolume", "ZEP_RaidArray", "ZEP_RaidMember", "CIM_StoragePool", "ZEP_BlockDevice", "ZEP_BlockQueue",
                  "CIM_UnixLocalFileSystem", "CIM_RemoteFileSystem", "ZEP_Mount", "ZEP_SwapArea"));
}

TEST_F(StorageNamespaceTest, AssociationsLeadFromAPartitionToTheController) {
  std::string const device = "/sys/devices/pci0000:00/0000:00:1f.2/host0/target0:0:0/0:0:0:0";
  fTree.AddDisk(device, "sda", "8:0", "2048");
  fTree.AddPartition(device + "/block/sda", "sda1", "8:1", "34", "1000");
  fTree.AddDisk("/sys/devices/platform/floppy.0", "fd0", "2:0", "0");
  Fill();
  EXPECT_THAT(Values("CIM_MediaAccessDevice", "DeviceID"), ElementsAre("sda", "fd0"));
  EXPECT_THAT(Values("CIM_StorageExtent", "DeviceID"), ElementsAre("sda", "sda1"));
  EXPECT_THAT(Values("CIM_MediaPresent", "Antecedent"), ElementsAre(HasSubstr("CIM_DiskDrive.")));
  EXPECT_THAT(Values("CIM_BasedOn", "Antecedent"), ElementsAre(HasSubstr("DeviceID=\"sda\"")));
  EXPECT_THAT(Values("CIM_BasedOn", "Dependent"), ElementsAre(HasSubstr("DeviceID=\"sda1\"")));
  EXPECT_THAT(Values("CIM_BasedOn", "StartingAddress"), ElementsAre("17408"));
  EXPECT_EQ(Values("CIM_SystemDevice", "PartComponent").size(), 5u);
  EXPECT_EQ(Values("CIM_ElementSoftwareIdentity", "Dependent").size(), 2u);
  EXPECT_EQ(Values("CIM_Realizes", "Dependent").size(), 3u);
  EXPECT_THAT(Values("CIM_ControlledBy", "Dependent"), ElementsAre(HasSubstr("DeviceID=\"sda\"")));
}

TEST_F(StorageNamespaceTest, WithoutUdevTheContentIsThatOfBlkid) {
  std::string const device = "/sys/devices/pci0000:00/0000:00:1f.2/host0/target0:0:0/0:0:0:0";
  fTree.AddDisk(device, "sda", "8:0", "2048");
  fTree.AddPartition(device + "/block/sda", "sda1", "8:1", "34", "1000");
  fTree.AddPartition(device + "/block/sda", "sda2", "8:2", "1034", "1000");
  fTree.Add("/zep-answers/blkid/sda1", "ID_FS_TYPE=xfs\nID_FS_USAGE=filesystem\nID_PART_ENTRY_SCHEME=gpt\n");
  fTree.Add("/zep-answers/blkid/sda2", "ID_FS_TYPE=ext4\nID_FS_USAGE=filesystem\n");
  fTree.Add("/run/udev/data/b8:2", "E:ID_FS_TYPE=swap\n");
  Fill();
  EXPECT_THAT(Values("CIM_GPTDiskPartition", "DeviceID"), ElementsAre("sda1"));
  EXPECT_THAT(Values("CIM_FileSystem", "Name"), ElementsAre("/dev/sda1"));
  EXPECT_THAT(Values("CIM_ResidesOnExtent", "Antecedent"), ElementsAre(HasSubstr("DeviceID=\"sda1\"")));
}

// tests/data/storage/NAME.txt has the complete text. To renew it after a change: ZEP_RENEW_TEXTS=1 storage_tests.
TEST_F(StorageNamespaceTest, RecordedMachinesAreDescribedCompletely) {
  for (std::string const name : {"server", "degraded"}) {
    SCOPED_TRACE(name);
    TRecordedMachine const machine(name);
    auto const ns = NewNamespace();
    FillStorageNamespace(*ns, TMachineFiles(machine.Root()));
    std::string const text = TextOf(*ns), file = TestDataPath("storage/" + name + ".txt");
    if (std::getenv("ZEP_RENEW_TEXTS") != nullptr) WriteFile(file, text);
    EXPECT_EQ(text, ReadFile(file));
  }
}

}  // namespace
}  // namespace NQRVZEP20
