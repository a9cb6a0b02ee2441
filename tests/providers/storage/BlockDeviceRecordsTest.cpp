// SPDX-License-Identifier: Apache-2.0
#include "providers/storage/BlockDeviceRecords.h"

#include "tests/providers/storage/MachineTree.h"

namespace NQRVZEP20 {
namespace {

class BlockDeviceRecordsTest : public testing::Test {
protected:
  void SetQueue(std::string const& file, std::string const& text) { fTree.Add(fPath + "/queue/" + file, text + "\n"); }

  std::string QueueValue(char const* property) const {
    return LineOf(BlockQueueRecord(fTree.fFiles, BlockDevicesOf(fTree.fFiles).at(0)), property);
  }

  std::string const fScsi = "/sys/devices/pci0000:00/0000:00:1f.2/host0/target0:0:0/0:0:0:0";
  std::string const fPath = fScsi + "/block/sda";
  TMachineTree fTree;
};

TEST_F(BlockDeviceRecordsTest, TypesAreTheWordsOfLsblk) {
  struct TRow {
    TBlockDevice::EKind fKind;
    char const *fName, *fFile, *fText, *fType;
  };
  TRow const rows[] = {
      {TBlockDevice::kDisk, "sda", "", "", "disk"},
      {TBlockDevice::kOptical, "sr0", "", "", "rom"},
      {TBlockDevice::kPartition, "sda1", "", "", "part"},
      {TBlockDevice::kArray, "md0", "md/level", "raid5", "raid5"},
      {TBlockDevice::kMapped, "dm-0", "dm/uuid", "LVM-abc", "lvm"},
      {TBlockDevice::kMapped, "dm-0", "dm/uuid", "CRYPT-LUKS2-abc-x", "crypt"},
      {TBlockDevice::kMapped, "dm-0", "dm/uuid", "mpath-3600", "mpath"},
      {TBlockDevice::kMapped, "dm-0", "dm/uuid", "part2-mpath-3600", "part"},
      {TBlockDevice::kMapped, "dm-0", "", "", "dm"},
      {TBlockDevice::kOther, "loop7", "", "", "loop"},
      {TBlockDevice::kOther, "zram0", "", "", "zram"},
  };
  for (TRow const& row : rows) {
    TMachineTree tree;
    TBlockDevice device;
    device.fName = row.fName;
    device.fKind = row.fKind;
    if (*row.fFile != '\0') tree.Add(device.File(row.fFile), std::string(row.fText) + "\n");
    EXPECT_EQ(TextOf(TypeOf(tree.fFiles, device)), row.fType) << row.fName;
  }
}

TEST_F(BlockDeviceRecordsTest, ContentIsThatOfUdev) {
  fTree.AddDisk(fScsi, "sda", "8:0", "2048");
  fTree.Add(fPath + "/alignment_offset", "-1\n");
  TRecord const record = BlockDeviceRecord(
      fTree.fFiles, BlockDevicesOf(fTree.fFiles).at(0),
      TUdevRecord::From("E:ID_FS_USAGE=filesystem\nE:ID_FS_TYPE=ext4\nE:ID_FS_UUID_ENC=5\nE:ID_PART_ENTRY_TYPE=6\n"));
  EXPECT_EQ(LineOf(record, "Node"), "/dev/sda");
  EXPECT_EQ(LineOf(record, "Number"), "8:0");
  EXPECT_EQ(LineOf(record, "Size"), "1048576");
  EXPECT_EQ(LineOf(record, "ContentType"), "ext4");
  EXPECT_EQ(LineOf(record, "ContentUUID"), "5");
  EXPECT_EQ(LineOf(record, "EntryType"), "<this device is not a partition>");
  EXPECT_EQ(LineOf(record, "AlignmentOffset"), "<" + fPath + "/alignment_offset is -1: the device is misaligned>");
}

TEST_F(BlockDeviceRecordsTest, Queue) {
  fTree.AddDisk(fScsi, "sda", "8:0", "2048");
  SetQueue("scheduler", "none [mq-deadline] bfq");
  SetQueue("read_ahead_kb", "128");
  SetQueue("optimal_io_size", "0");
  SetQueue("zoned", "none");
  SetQueue("chunk_sectors", "0");
  EXPECT_EQ(QueueValue("Scheduler"), "mq-deadline");
  EXPECT_EQ(QueueValue("ReadAhead"), "131072");
  EXPECT_EQ(QueueValue("Rotational"), "true");
  EXPECT_EQ(QueueValue("OptimalIOSize"), "<the device reports no optimal size>");
  EXPECT_EQ(QueueValue("ZoneSize"), "<the device has no zones>");
  SetQueue("zoned", "host-managed");
  SetQueue("chunk_sectors", "524288");
  EXPECT_EQ(QueueValue("ZoneSize"), "268435456");
  for (char const* text : {"none", "]none[", "[", "]"}) {
    SetQueue("scheduler", text);
    EXPECT_EQ(QueueValue("Scheduler"), text);
  }
}

}  // namespace
}  // namespace NQRVZEP20
