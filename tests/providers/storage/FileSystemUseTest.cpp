// SPDX-License-Identifier: Apache-2.0
#include "providers/storage/FileSystemUse.h"

#include "tests/providers/storage/MachineTree.h"

#include <sys/statvfs.h>

namespace NQRVZEP20 {
namespace {

TEST(FileSystemUseTest, SizesAreInBytes) {
  auto const use = UseFrom("8192 1024 100 50 40 10 3 255\n");
  ASSERT_TRUE(use);
  EXPECT_EQ(use->fBlockSize, 8192u);
  EXPECT_EQ(use->fFragmentSize, 1024u);
  EXPECT_EQ(use->fSize, 102400u);
  EXPECT_EQ(use->fFree, 51200u);
  EXPECT_EQ(use->fAvailable, 40960u);
  EXPECT_EQ(use->fFiles, 10u);
  EXPECT_EQ(use->fFreeFiles, 3u);
  EXPECT_EQ(use->fMaxNameLength, 255u);
}

TEST(FileSystemUseTest, OtherTextsHaveAReason) {
  for (char const* text : {"", "1 2 3", "8192 1024 100 50 40 10 3 x", "8192 1024 18446744073709551615 50 40 10 3 255"})
    EXPECT_FALSE(UseFrom(text)) << text;
}

TEST(FileSystemUseTest, TheKernelIsAskedOnThisMachine) {
  struct statvfs status;
  ASSERT_EQ(::statvfs("/", &status), 0);
  auto const use = UseOf(TMachineFiles("/"), "/");
  ASSERT_TRUE(use);
  EXPECT_EQ(use->fSize, status.f_blocks * status.f_frsize);
  EXPECT_EQ(TextOf(UseOf(TMachineFiles("/"), "/no such directory").Then([](TFileSystemUse const&) { return 1; })),
            "<statvfs fails for /no such directory: No such file or directory>");
}

TEST(FileSystemUseTest, ARecordedAnswerIsUsedForAnotherMachine) {
  TMachineTree tree;
  tree.Add("/zep-answers/statvfs/boot/efi/values", "512 512 2 1 1 0 0 12\n");
  auto const use = UseOf(tree.fFiles, "/boot/efi");
  ASSERT_TRUE(use);
  EXPECT_EQ(use->fSize, 1024u);
  EXPECT_FALSE(UseOf(tree.fFiles, "/"));
}

}  // namespace
}  // namespace NQRVZEP20
