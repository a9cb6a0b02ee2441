// SPDX-License-Identifier: Apache-2.0
#include "providers/storage/ExtentRecords.h"

#include "tests/providers/storage/MachineTree.h"

namespace NQRVZEP20 {
namespace {

class ExtentRecordsTest : public testing::Test {
protected:
  ExtentRecordsTest() {
    fTree.AddDisk(fScsi, "sda", "8:0", "2048");
    fTree.AddPartition(fScsi + "/block/sda", "sda1", "8:1", "34", "1000");
  }

  TRecord Partition(std::string const& udev) {
    TBlockDevice const device = BlockDevicesOf(fTree.fFiles).at(1);
    return PartitionRecord(fTree.fFiles, PartitionOf(fTree.fFiles, device, TUdevRecord::From(udev)), fSystem);
  }

  TMachineTree fTree;
  TComputerSystem const fSystem{fTree.fFiles};
  std::string const fScsi = "/sys/devices/pci0000:00/0000:00:1f.2/host0/target0:0:0/0:0:0:0";
};

TEST_F(ExtentRecordsTest, APartitionHasTheBlocksOfItsDisk) {
  TRecord const record = Partition("");
  EXPECT_EQ(record.GetClassName(), "CIM_GenericDiskPartition");
  EXPECT_EQ(LineOf(record, "DeviceID"), "sda1");
  EXPECT_EQ(LineOf(record, "Name"), "/dev/sda1");
  EXPECT_EQ(LineOf(record, "BlockSize"), "512");
  EXPECT_EQ(LineOf(record, "NumberOfBlocks"), "1000");
  EXPECT_EQ(LineOf(record, "Access"), "3");
  EXPECT_EQ(LineOf(record, "Primordial"), "false");
}

TEST_F(ExtentRecordsTest, EntryOfAGpt) {
  TRecord const record = Partition(
      "E:ID_PART_ENTRY_SCHEME=gpt\nE:ID_PART_ENTRY_NAME=EFI\\x20System\nE:ID_PART_ENTRY_TYPE=c12a7328\nE:ID_PART_ENTRY_UUID=5\n"
      "E:ID_PART_ENTRY_FLAGS=0x4\n");
  EXPECT_EQ(record.GetClassName(), "CIM_GPTDiskPartition");
  EXPECT_EQ(LineOf(record, "ElementName"), "EFI System");
  EXPECT_EQ(LineOf(record, "PartitionType"), "c12a7328");
  EXPECT_EQ(LineOf(record, "Signature"), "5");
  EXPECT_EQ(LineOf(record, "Bootable"), "true");
}

TEST_F(ExtentRecordsTest, EntriesOfAnMbr) {
  struct TRow {
    char const *fType, *fNumber, *fKind, *fSubtype, *fIsPrimary;
  };
  TRow const rows[] = {
      {"0x83", "1", "1", "131", "true"},
      {"0x5", "2", "2", "5", "false"},
      {"0x7", "5", "3", "7", "false"},
      {"0x8e", "4", "1", "<the schema has no name for the partition type 142>", "true"},
      {"wood", "1", "<the udev database has \"wood\", which is not a hexadecimal number>",
       "<the udev database has \"wood\", which is not a hexadecimal number>",
       "<the udev database has \"wood\", which is not a hexadecimal number>"},
  };
  for (TRow const& row : rows) {
    fTree.Add(fScsi + "/block/sda/sda1/partition", std::string(row.fNumber) + "\n");
    TRecord const record = Partition("E:ID_PART_ENTRY_SCHEME=dos\nE:ID_PART_ENTRY_TYPE=" + std::string(row.fType) + "\n");
    EXPECT_EQ(record.GetClassName(), "CIM_DiskPartition");
    EXPECT_EQ(LineOf(record, "PartitionType"), row.fKind);
    EXPECT_EQ(LineOf(record, "PartitionSubtype"), row.fSubtype);
    EXPECT_EQ(LineOf(record, "PrimaryPartition"), row.fIsPrimary);
    EXPECT_EQ(LineOf(record, "Bootable"), "false");
  }
}

TEST_F(ExtentRecordsTest, WithoutUdevTheKernelKnowsTheNameOfAPartition) {
  fTree.Add(fScsi + "/block/sda/sda1/uevent", "DEVNAME=sda1\nPARTN=1\nPARTNAME=boot\n");
  EXPECT_EQ(LineOf(Partition(""), "ElementName"), "boot");
}

TEST_F(ExtentRecordsTest, PlacesAreInBytes) {
  TPartition const partition = PartitionOf(fTree.fFiles, BlockDevicesOf(fTree.fFiles).at(1), TUdevRecord::From(""));
  EXPECT_THAT(LinesOf(BasedOnRecord(partition.fStart, partition.fSize)),
              ElementsAre("StartingAddress=17408", "EndingAddress=529407", "OrderIndex=0"));
}

}  // namespace
}  // namespace NQRVZEP20
