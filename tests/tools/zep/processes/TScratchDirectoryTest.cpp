// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/processes/TScratchDirectory.h"

#include "tests/Support.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <memory>

namespace NQRVZEP20::zep {
namespace {

namespace fs = std::filesystem;

TEST(TScratchDirectoryTest, IsRemovedWithItsContentsUnlessItIsKept) {
  std::string removed, kept;
  {
    TScratchDirectory first("zep-scratch-test"), second("zep-scratch-test");
    removed = first.Path();
    kept = second.Path();
    WriteFile(first.Path("file"), "content");
    second.Keep();
  }
  EXPECT_FALSE(fs::exists(removed));
  EXPECT_TRUE(fs::remove(kept));
}

TEST(TScratchDirectoryTest, ManyNestedDirectoriesAreRemoved) {
  std::string path;
  {
    TScratchDirectory const directory("zep-scratch-test");
    path = directory.Path();
    fs::path deepest = path;
    for (int i = 0; i < 300; ++i) fs::create_directory(deepest /= "d");
  }
  EXPECT_FALSE(fs::exists(path));
}

// The order in which they are destroyed does not matter.
TEST(TScratchDirectoryTest, AllThatExistAreRemovedTogether) {
  TScratchDirectory const first("zep-scratch-test");
  auto ended = std::make_unique<TScratchDirectory>("zep-scratch-test");
  TScratchDirectory const last("zep-scratch-test");
  TScratchDirectory kept("zep-scratch-test");
  kept.Keep();
  ended.reset();
  TScratchDirectory::RemoveAll();
  EXPECT_FALSE(fs::exists(first.Path()));
  EXPECT_FALSE(fs::exists(last.Path()));
  EXPECT_TRUE(fs::remove(kept.Path()));
}

}  // namespace
}  // namespace NQRVZEP20::zep
