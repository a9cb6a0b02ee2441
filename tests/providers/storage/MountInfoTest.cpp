// SPDX-License-Identifier: Apache-2.0
#include "providers/storage/MountInfo.h"

#include "tests/providers/storage/MachineTree.h"

namespace NQRVZEP20 {
namespace {

std::vector<std::string> Mounts(std::string const& text) {
  std::vector<std::string> lines;
  for (TMount const& mount : MountsFrom(text))
    lines.push_back(mount.fId + "|" + mount.fNumber + "|" + mount.fRoot + "|" + mount.fMountPoint + "|" + mount.fOptions + "|" +
                    mount.fPropagation + "|" + mount.fType + "|" + mount.fSource + "|" + mount.fSuperOptions);
  return lines;
}

TEST(MountInfoTest, FieldsOfAMount) {
  EXPECT_THAT(Mounts("28 1 9:0 / /data rw,noatime - ext4 /dev/md0 rw,errors=remount-ro\n"),
              ElementsAre("28|9:0|/|/data|rw,noatime||ext4|/dev/md0|rw,errors=remount-ro"));
}

TEST(MountInfoTest, TagsBeforeTheDashAreThePropagation) {
  EXPECT_THAT(Mounts("29 1 8:1 /sub /a rw shared:1 master:2 - xfs /dev/sda1 rw"),
              ElementsAre("29|8:1|/sub|/a|rw|shared:1 master:2|xfs|/dev/sda1|rw"));
}

TEST(MountInfoTest, EscapesAreDecoded) {
  EXPECT_THAT(Mounts("1 0 8:1 / /a\\040b\\011c\\134d rw - vfat /dev/disk/by-label/A\\040B rw\n"),
              ElementsAre("1|8:1|/|/a b\tc\\d|rw||vfat|/dev/disk/by-label/A B|rw"));
  EXPECT_THAT(Mounts("1 0 8:1 / /a\\04 rw - vfat \\9 rw\n"), ElementsAre("1|8:1|/|/a\\04|rw||vfat|\\9|rw"));
}

TEST(MountInfoTest, ASourceMayBeEmpty) {
  EXPECT_THAT(Mounts("1 0 0:30 / /t rw - tmpfs  rw\n"), ElementsAre("1|0:30|/|/t|rw||tmpfs||rw"));
}

TEST(MountInfoTest, MalformedLinesAreOmitted) {
  for (char const* text : {"", "\n", "1 0 8:1 / /a rw", "1 0 8:1 / /a rw -", "1 0 8:1 / /a rw - ext4", "- - - - - - -", "a b c"})
    EXPECT_THAT(Mounts(text), IsEmpty()) << text;
}

TEST(MountInfoTest, SwapAreas) {
  std::vector<TSwap> const swaps = SwapsFrom(
      "Filename\t\t\t\tType\t\tSize\t\tUsed\t\tPriority\n/dev/sda2 partition 1024 5 -2\n/a\\040b file 2048 0 10\n/x file\n");
  ASSERT_EQ(swaps.size(), 2u);
  EXPECT_EQ(swaps[0].fFile + swaps[0].fType, "/dev/sda2partition");
  EXPECT_EQ(swaps[0].fSize, 1024u);
  EXPECT_EQ(swaps[0].fUsed, 5u);
  EXPECT_EQ(swaps[0].fPriority, -2);
  EXPECT_EQ(swaps[1].fFile, "/a b");
}

}  // namespace
}  // namespace NQRVZEP20
