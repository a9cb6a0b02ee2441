// SPDX-License-Identifier: Apache-2.0

// The working directory, the environment, and paths below another.

#include "TOSSpecific.h"
#include "tests/os/HostTools.h"

#include <sys/stat.h>

namespace NQRVZEP20 {
namespace {

namespace fs = std::filesystem;
using TEntries = std::vector<std::string>;

// ---- GetCurrentDir ----

TEST(GetCurrentDirTest, IsTheWorkingDirectory) {
  TTempDir const dir;
  TWorkingDirectory const directory(dir.Path());
  EXPECT_EQ(TOSSpecific::GetCurrentDir(), dir.Path());
  EXPECT_EQ(InChild([] {
              fs::current_path("/");
              return TOSSpecific::GetCurrentDir();
            }),
            "/");
}

TEST(GetCurrentDirTest, APathOf1023BytesIsTheLongest) {
  TTempDir const dir;
  auto const currentDirOfLength = [&](std::size_t length) {
    return InChild([&] {
      fs::create_directory(dir.Path(std::to_string(length)));
      fs::current_path(dir.Path(std::to_string(length)));
      GoDownTo(length);
      return std::to_string(TOSSpecific::GetCurrentDir().size());
    });
  };
  EXPECT_EQ(currentDirOfLength(1022), "1022");
  EXPECT_EQ(currentDirOfLength(1023), "1023");
  EXPECT_EQ(currentDirOfLength(1024), "threw kZEPStatusFail");
  EXPECT_EQ(currentDirOfLength(3000), "threw kZEPStatusFail");
}

TEST(GetCurrentDirTest, ADeletedDirectoryThrows) {
  TTempDir const dir;
  EXPECT_EQ(InChild([&] {
              fs::create_directory(dir.Path("gone"));
              fs::current_path(dir.Path("gone"));
              fs::remove(dir.Path("gone"));
              return TOSSpecific::GetCurrentDir();
            }),
            "threw kZEPStatusFail");
}

// ---- GetEnvironment and PutEnvironment ----

TEST(EnvironmentTest, GetsTheValueOfAVariable) {
  TEnvironmentGuard const full("ZEP_TEST_FULL", "a=b c"), empty("ZEP_TEST_EMPTY", "");
  EXPECT_EQ(LogOf([] {
              EXPECT_EQ(TOSSpecific::GetEnvironment("ZEP_TEST_FULL"), "a=b c");
              EXPECT_EQ(TOSSpecific::GetEnvironment("ZEP_TEST_EMPTY"), "");
            }),
            TEntries{});
}

TEST(EnvironmentTest, AVariableThatIsNotSetIsEmptyAndLogged) {
  TEnvironmentGuard const unset("ZEP_TEST_UNSET", nullptr);
  for (char const* name : {"ZEP_TEST_UNSET", "", "PATH=x"})
    EXPECT_EQ(LogOf([&] { EXPECT_EQ(TOSSpecific::GetEnvironment(name), ""); }),
              (TEntries{"[Debug] TOSSpecific debug output: [ERROR]GetEnvironment:Cannt get environmnet."}));
}

TEST(EnvironmentTest, PutsAVariableInPlaceOfAnEarlierOne) {
  TEnvironmentGuard const unset("ZEP_TEST_PUT", nullptr);
  EXPECT_EQ(LogOf([] {
              EXPECT_TRUE(TOSSpecific::PutEnvironment("ZEP_TEST_PUT", "first"));
              EXPECT_EQ(TOSSpecific::GetEnvironment("ZEP_TEST_PUT"), "first");
              EXPECT_TRUE(TOSSpecific::PutEnvironment("ZEP_TEST_PUT", "second=2"));
              EXPECT_EQ(TOSSpecific::GetEnvironment("ZEP_TEST_PUT"), "second=2");
              EXPECT_TRUE(TOSSpecific::PutEnvironment("ZEP_TEST_PUT", ""));
              EXPECT_EQ(TOSSpecific::GetEnvironment("ZEP_TEST_PUT"), "");
            }),
            TEntries{});
  EXPECT_STREQ(::getenv("ZEP_TEST_PUT"), "");
}

TEST(EnvironmentTest, ANameThatWillNotDoIsFalseAndLogged) {
  for (char const* name : {"", "A=B", "="})
    EXPECT_EQ(LogOf([&] { EXPECT_FALSE(TOSSpecific::PutEnvironment(name, "value")); }),
              (TEntries{"[Debug] TOSSpecific debug output: [ERROR]PutEnvironment occured errors."}));
}

// ---- RelocateRelativePath ----

TEST(RelocateRelativePathTest, PutsARelativePathBelowTheBase) {
  struct TRow {
    std::string fBase, fPath, fResult;
  };
  TRow const rows[] = {
      {"/opt/a", "b/", "/opt/a/b"},
      {"/opt/a", "b", "/opt/a/b"},
      {"/opt/a/", "b", "/opt/a/b"},
      {"/opt/a//", "b", "/opt/a//b"},
      {"/opt/a", "b/c//", "/opt/a/b/c/"},  // one separator is taken off
      {"/opt/a", "../b", "/opt/a/../b"},
      {"/opt/a", "", "/opt/a/"},
      {"/", "b", "/b"},
      {"base", "b", "base/b"},
      {"/opt/a", "/etc/x", "/etc/x"},
      {"/opt/a", "/etc/x/", "/etc/x"},
      {"/opt/a", "//", "/"},
      {"/opt/a", "/", "/opt/a/"},  // the root is empty without its separator, and so counts as relative
      {"", "b", "b"},
      {"", "b/", "b"},
      {"", "/etc/x/", "/etc/x"},
      {"", "", ""},
      {"", "/", ""},
  };
  for (TRow const& row : rows)
    EXPECT_EQ(TOSSpecific::RelocateRelativePath(row.fBase, row.fPath), row.fResult) << row.fBase << " " << row.fPath;
}

}  // namespace
}  // namespace NQRVZEP20
