// SPDX-License-Identifier: Apache-2.0
#include "providers/controller/TSdrCacheFile.h"

#include "tests/Support.h"
#include "tests/providers/controller/ControllerBytes.h"

#include <gtest/gtest.h>
#include <sys/stat.h>

#include <filesystem>

namespace NQRVZEP20 {
namespace {

class TSdrCacheFileTest : public testing::Test {
protected:
  std::string File() const { return fDir.Path("zep/sdr-s1"); }

  TTempDir const fDir;
  TEnvironmentGuard const fCache{"XDG_CACHE_HOME", fDir.Path().c_str()};
  std::vector<std::string> const fRecords = {FullSensorRecord(0, 1, "A"), CompactSensorRecord(1, 2, 8, "B")};
};

TEST_F(TSdrCacheFileTest, RecordsAreReadAgainForTheSameControllerAndState) {
  TSdrCacheFile const cache("s1", "id");
  EXPECT_FALSE(cache.Load("state"));
  cache.Save("state", fRecords);
  EXPECT_EQ(*cache.Load("state"), fRecords);
  EXPECT_FALSE(cache.Load("later"));
  EXPECT_FALSE(TSdrCacheFile("s1", "another").Load("state"));
  EXPECT_FALSE(TSdrCacheFile("s2", "id").Load("state"));
}

TEST_F(TSdrCacheFileTest, OnlyTheOwnerMayReadTheFile) {
  TSdrCacheFile("s1", "id").Save("state", fRecords);
  struct stat status {};
  ASSERT_EQ(::stat(File().c_str(), &status), 0);
  EXPECT_EQ(status.st_mode & 0777, 0600U);
}

TEST_F(TSdrCacheFileTest, ADamagedFileIsNoCache) {
  TSdrCacheFile const cache("s1", "id");
  cache.Save("state", fRecords);
  std::string const content = ReadFile(File());
  for (std::string const& damaged :
       {content.substr(0, content.size() - 1), content + "zz\n", content + "a\n", std::string("x")}) {
    WriteFile(File(), damaged);
    EXPECT_FALSE(cache.Load("state"));
  }
}

TEST_F(TSdrCacheFileTest, ALinkIsNoCache) {
  TSdrCacheFile const cache("s1", "id");
  cache.Save("state", fRecords);
  std::filesystem::rename(File(), fDir.Path("elsewhere"));
  std::filesystem::create_symlink(fDir.Path("elsewhere"), File());
  EXPECT_FALSE(cache.Load("state"));
}

TEST_F(TSdrCacheFileTest, ANameCannotLeadElsewhere) {
  TSdrCacheFile("../x", "id").Save("state", fRecords);
  EXPECT_TRUE(std::filesystem::exists(fDir.Path("zep/sdr-..%2fx")));
}

TEST_F(TSdrCacheFileTest, WithoutADirectoryThereIsNoCache) {
  TEnvironmentGuard const noCache("XDG_CACHE_HOME", nullptr), noHome("HOME", nullptr);
  TSdrCacheFile const cache("s1", "id");
  cache.Save("state", fRecords);
  EXPECT_FALSE(cache.Load("state"));
}

}  // namespace
}  // namespace NQRVZEP20
