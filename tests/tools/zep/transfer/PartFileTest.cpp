// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/transfer/PartFile.h"

#include "tests/Support.h"

#include <grp.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>

namespace NQRVZEP20::zep {
namespace {

constexpr uid_t kNobody = 65534;
constexpr gid_t kGroup = 12345;  // which has no members

struct stat StatusOf(std::string const& file) {
  struct stat status {};
  EXPECT_EQ(::stat(file.c_str(), &status), 0) << file;
  return status;
}

class PartFileTest : public testing::Test {
protected:
  // A file that an unprivileged user ("nobody") is allowed to replace.
  void MakeFile(gid_t group, mode_t mode) {
    WriteFile(fFile, "old");
    ASSERT_EQ(::chown(fFile.c_str(), kNobody, group), 0);
    ASSERT_EQ(::chmod(fFile.c_str(), mode), 0);
    ASSERT_EQ(::chown(fDir.Path().c_str(), kNobody, kNobody), 0);
  }
  // Returns the result.
  int MakeAndRenamePart() {
    WriteFile(fPart, "new");
    EXPECT_EQ(::chmod(fPart.c_str(), 0600), 0);
    return RenamePart(fPart, fFile, true);
  }

  TTempDir fDir;
  std::string const fFile = fDir.Path("f"), fPart = fDir.Path("f.part");
};

TEST_F(PartFileTest, KeepsTheGroupAndTheModeOfTheReplacedFile) {
  NEEDS(::geteuid() == 0, "root, who may give a file to any group");
  for (mode_t const mode : {0600u, 0640u, 0664u, 0604u}) {
    SCOPED_TRACE(mode);
    MakeFile(kGroup, mode);
    ASSERT_EQ(MakeAndRenamePart(), 0);
    EXPECT_EQ(ReadFile(fFile), "new");
    EXPECT_EQ(StatusOf(fFile).st_gid, kGroup);
    EXPECT_EQ(StatusOf(fFile).st_mode & 07777, mode);
  }
}

// The members of the former group are then among the others, who must not get more than that group had.
TEST_F(PartFileTest, WithoutTheRightToTheGroupNoOtherGroupGetsItsPermissions) {
  NEEDS(::geteuid() == 0, "root, who can become another user");
  struct {
    mode_t fBefore, fAfter;
  } const rows[] = {{0600, 0600}, {0640, 0600}, {0664, 0604}, {0666, 0606}, {0604, 0600}, {0755, 0705}};
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fBefore);
    MakeFile(kGroup, row.fBefore);
    EXPECT_EXIT(
        {
          bool const isNobody = ::setgroups(0, nullptr) == 0 && ::setgid(kNobody) == 0 && ::setuid(kNobody) == 0;
          ::_exit(isNobody ? MakeAndRenamePart() : 255);
        },
        testing::ExitedWithCode(0), "");
    EXPECT_EQ(ReadFile(fFile), "new");
    EXPECT_EQ(StatusOf(fFile).st_gid, kNobody);
    EXPECT_EQ(StatusOf(fFile).st_mode & 07777, row.fAfter);
  }
}

TEST_F(PartFileTest, APartThatCannotBeRenamedStaysPrivate) {
  WriteFile(fFile, "old");
  WriteFile(fPart, "new");
  EXPECT_EQ(RenamePart(fPart, fFile, false), EEXIST);
  EXPECT_EQ(ReadFile(fFile), "old");
  EXPECT_EQ(StatusOf(fPart).st_mode & 07777, 0600u);
}

}  // namespace
}  // namespace NQRVZEP20::zep
