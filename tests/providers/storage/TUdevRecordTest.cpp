// SPDX-License-Identifier: Apache-2.0
#include "providers/storage/TUdevRecord.h"

#include "tests/providers/storage/MachineTree.h"

namespace NQRVZEP20 {
namespace {

constexpr char const* kText =
    "S:disk/by-uuid/5\nS:disk/by-id/a\nI:1655\nE:ID_MODEL=A_B\nE:ID_MODEL_ENC=A\\x20B\\x20\\x20\nE:EMPTY=\nE:BLANK_ENC=\\x20\n"
    "E:SIGN=a=b\nG:systemd\n";

TEST(TUdevRecordTest, PropertiesAndLinksAreRead) {
  TUdevRecord const record = TUdevRecord::From(kText);
  EXPECT_TRUE(record.Exists());
  EXPECT_EQ(TextOf(record.Value("ID_MODEL")), "A_B");
  EXPECT_EQ(TextOf(record.Value("SIGN")), "a=b");
  EXPECT_EQ(TextOf(record.DecodedValue("ID_MODEL_ENC")), "A B");
  EXPECT_EQ(TextOf(record.Value("EMPTY")), "<the udev database has no EMPTY of this device>");
  EXPECT_EQ(TextOf(record.DecodedValue("BLANK_ENC")), "<the udev database has only blanks as BLANK_ENC of this device>");
  EXPECT_THAT(*record.Links(), ElementsAre("/dev/disk/by-id/a", "/dev/disk/by-uuid/5"));
}

TEST(TUdevRecordTest, OnlyCompleteEscapesAreDecoded) {
  struct TRow {
    char const *fText, *fDecoded;
  };
  TRow const rows[] = {{"a\\x2fb", "a/b"}, {"a\\x2", "a\\x2"},     {"\\x", "\\x"}, {"\\xzz", "\\xzz"},
                       {"\\x2g", "\\x2g"}, {"\\x5c\\x5c", "\\\\"}, {"\\", "\\"},   {"\\x41\\x", "A\\x"}};
  for (TRow const& row : rows)
    EXPECT_EQ(TextOf(TUdevRecord::From("E:X=" + std::string(row.fText)).DecodedValue("X")), row.fDecoded) << row.fText;
}

TEST(TUdevRecordTest, TheOutputOfBlkidHasTheSameProperties) {
  TUdevRecord const record = TUdevRecord::FromBlkid("ID_FS_TYPE=ext4\nID_FS_LABEL_ENC=a\\x20b\n");
  EXPECT_EQ(TextOf(record.Value("ID_FS_TYPE")), "ext4");
  EXPECT_EQ(TextOf(record.DecodedValue("ID_FS_LABEL_ENC")), "a b");
  EXPECT_EQ(TextOf(record.Value("ID_FS_UUID")), "<the output of blkid has no ID_FS_UUID of this device>");
  EXPECT_EQ(TextOf(TUdevRecord::FromBlkid("").Value("ID_FS_TYPE")),
            "<without udev: blkid found nothing on this device, or could not read it>");
}

TEST(TUdevRecordTest, MalformedLinesAreIgnored) {
  TUdevRecord const record = TUdevRecord::From("E:\nE\nE:=\nS:\n\n=\nE:A");
  EXPECT_TRUE(record.Exists());
  EXPECT_FALSE(record.Links());
  EXPECT_FALSE(record.Value("A"));
}

TEST(TUdevRecordTest, WithoutADatabaseEveryValueHasThatReason) {
  TMachineTree tree;
  TUdevRecord const record = TUdevRecord::Of(tree.fFiles, std::string("8:0"));
  EXPECT_FALSE(record.Exists());
  EXPECT_EQ(TextOf(record.Value("ID_MODEL")), "</run/udev/data/b8:0 does not exist>");
  EXPECT_EQ(record.Links().Why().fReason, "/run/udev/data/b8:0 does not exist");
}

TEST(TUdevRecordTest, TheRecordOfADeviceIsFoundByItsNumber) {
  TMachineTree tree;
  tree.Add("/run/udev/data/b8:0", "E:ID_SERIAL=5\n");
  EXPECT_EQ(TextOf(TUdevRecord::Of(tree.fFiles, std::string("8:0")).Value("ID_SERIAL")), "5");
}

}  // namespace
}  // namespace NQRVZEP20
