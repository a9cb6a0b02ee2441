// SPDX-License-Identifier: Apache-2.0
#include "TOSSpecific.h"
#include "tests/Support.h"

#include <sched.h>
#include <sys/mount.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <sys/wait.h>
#include <unistd.h>

#include <functional>
#include <optional>

namespace NQRVZEP20 {
namespace {

namespace fs = std::filesystem;

class TOSSpecificFilesTest : public testing::Test {
protected:
  TTempDir fDir;
};

TEST(TOSSpecificFilesConstants, PathSeparatorIsASlash) { EXPECT_EQ(TOSSpecific::kFileSeparator, "/"); }

// ---- FileExists and DirExists ----

void MakeSocket(std::string const& path) {
  sockaddr_un address{};
  address.sun_family = AF_UNIX;
  ASSERT_LT(path.size(), sizeof address.sun_path);
  path.copy(address.sun_path, path.size());
  int const fd = ::socket(AF_UNIX, SOCK_STREAM, 0);
  ASSERT_EQ(::bind(fd, reinterpret_cast<sockaddr*>(&address), sizeof address), 0);
  ::close(fd);
}

TEST_F(TOSSpecificFilesTest, EverythingThatIsNotADirectoryIsAFile) {
  WriteFile(fDir.Path("file"), "");
  fs::create_directory(fDir.Path("dir"));
  fs::create_symlink("file", fDir.Path("linkToFile"));
  fs::create_symlink("dir", fDir.Path("linkToDir"));
  fs::create_symlink("nowhere", fDir.Path("dangling"));
  fs::create_symlink("loop", fDir.Path("loop"));
  ASSERT_EQ(::mkfifo(fDir.Path("pipe").c_str(), 0600), 0);
  ASSERT_NO_FATAL_FAILURE(MakeSocket(fDir.Path("socket")));

  struct TRow {
    std::string path;
    bool isFile, isDir;
  };
  TRow const rows[] = {
      {fDir.Path("file"), true, false},
      {fDir.Path("dir"), false, true},
      {fDir.Path("dir/"), false, true},
      {fDir.Path("dir/."), false, true},
      {fDir.Path("linkToFile"), true, false},
      {fDir.Path("linkToDir"), false, true},
      {fDir.Path("pipe"), true, false},
      {fDir.Path("socket"), true, false},
      {"/dev/null", true, false},
      {"/", false, true},
      {fDir.Path("dangling"), false, false},
      {fDir.Path("loop"), false, false},
      {fDir.Path("missing"), false, false},
      {fDir.Path("file/"), false, false},
      {fDir.Path("file/below"), false, false},
      {fDir.Path(std::string(300, 'x')), false, false},
      {"", false, false},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.path);
    EXPECT_EQ(TOSSpecific::FileExists(row.path), row.isFile);
    EXPECT_EQ(TOSSpecific::DirExists(row.path), row.isDir);
  }
}

// ---- CreateDir ----

TEST_F(TOSSpecificFilesTest, CreateDirMakesOneDirectory) {
  EXPECT_EQ(TOSSpecific::CreateDir(fDir.Path("new")), 0);
  EXPECT_TRUE(TOSSpecific::DirExists(fDir.Path("new")));
  EXPECT_EQ(TOSSpecific::CreateDir(fDir.Path("new/below/")), 0);
  EXPECT_TRUE(TOSSpecific::DirExists(fDir.Path("new/below")));
}

TEST_F(TOSSpecificFilesTest, CreateDirGivesAllPermissionsLessTheUmask) {
  struct TRow {
    mode_t mask, mode;
  };
  for (TRow const row : {TRow{0, 0777}, TRow{022, 0755}, TRow{027, 0750}, TRow{0777, 0}}) {
    std::string const path = fDir.Path("mask" + std::to_string(row.mask));
    mode_t const old = ::umask(row.mask);
    TOSSpecific::CreateDir(path);
    ::umask(old);
    struct stat status;
    ASSERT_EQ(::stat(path.c_str(), &status), 0);
    EXPECT_EQ(status.st_mode & 07777, row.mode) << "umask " << row.mask;
  }
}

TEST_F(TOSSpecificFilesTest, CreateDirThrowsWhatStoodInItsWay) {
  WriteFile(fDir.Path("file"), "");
  fs::create_directory(fDir.Path("dir"));
  fs::create_symlink("nowhere", fDir.Path("dangling"));
  struct TRow {
    std::string path;
    EZEPStatusCode status;
  };
  TRow const rows[] = {
      {fDir.Path("dir"), kZEPStatusDirectoryAlreadyExists},
      {fDir.Path("dir/"), kZEPStatusDirectoryAlreadyExists},
      {fDir.Path("file"), kZEPStatusDirectoryAlreadyExists},
      {fDir.Path("dangling"), kZEPStatusDirectoryAlreadyExists},
      {"/", kZEPStatusDirectoryAlreadyExists},
      {fDir.Path("missing/new"), kZEPStatusFileSystemError},  // parents are not made
      {fDir.Path("file/new"), kZEPStatusFileSystemError},
      {fDir.Path(std::string(300, 'x')), kZEPStatusFileSystemError},
      {"", kZEPStatusFileSystemError},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.path);
    EXPECT_STATUS(TOSSpecific::CreateDir(row.path), row.status);
  }
  EXPECT_FALSE(fs::exists(fDir.Path("missing")));
}

// The status that CreateDir throws in a child process that was prepared first; kZEPStatusOK when it throws nothing, and
// none when it could not be prepared.
std::optional<int> StatusOfCreateDirInChild(std::function<bool()> const& prepare, std::string const& path) {
  constexpr int kNotPrepared = 255;
  pid_t const child = ::fork();
  if (child == 0) {
    if (!prepare()) ::_exit(kNotPrepared);
    try {
      TOSSpecific::CreateDir(path);
      ::_exit(kZEPStatusOK);
    } catch (TZEPException const& e) {
      ::_exit(e.GetStatusCode().GetCode());
    }
  }
  int status = 0;
  EXPECT_EQ(::waitpid(child, &status, 0), child);
  EXPECT_TRUE(WIFEXITED(status));
  if (WEXITSTATUS(status) == kNotPrepared) return std::nullopt;
  return WEXITSTATUS(status);
}

bool BecomeNobody() {
  constexpr uid_t kNobody = 65534;
  return ::geteuid() != 0 || (::setgid(kNobody) == 0 && ::setuid(kNobody) == 0);
}

TEST_F(TOSSpecificFilesTest, CreateDirInADirectoryThatMayNotBeWrittenIsDenied) {
  fs::create_directory(fDir.Path("closed"));
  fs::permissions(fDir.Path("closed"), fs::perms::owner_read | fs::perms::owner_exec);
  EXPECT_EQ(StatusOfCreateDirInChild(BecomeNobody, fDir.Path("closed/new")), kZEPStatusAccessDenied);
}

TEST_F(TOSSpecificFilesTest, CreateDirOnAReadOnlyFileSystemIsDenied) {
  std::string const mountPoint = fDir.Path();
  auto const mountReadOnly = [&] {
    int const asRoot = ::geteuid() == 0 ? 0 : CLONE_NEWUSER;
    return ::unshare(asRoot | CLONE_NEWNS) == 0 && ::mount(nullptr, "/", nullptr, MS_REC | MS_PRIVATE, nullptr) == 0 &&
           ::mount("none", mountPoint.c_str(), "tmpfs", MS_RDONLY, nullptr) == 0;
  };
  std::optional<int> const status = StatusOfCreateDirInChild(mountReadOnly, fDir.Path("new"));
  if (!status) GTEST_SKIP() << "no leave to mount a file system";
  EXPECT_EQ(*status, kZEPStatusAccessDenied);
}

// ---- isOEMBuild ----

TEST_F(TOSSpecificFilesTest, OEMBuildIsTheOneWithTheReadmeBelowTheWorkingDirectory) {
  fs::path const old = fs::current_path();
  fs::current_path(fDir.Path());
  EXPECT_FALSE(TOSSpecific::isOEMBuild());
  fs::create_directories("docs/oem_zep_preboot_readme.txt");
  EXPECT_FALSE(TOSSpecific::isOEMBuild());  // a directory is not the file
  fs::remove("docs/oem_zep_preboot_readme.txt");
  WriteFile("docs/oem_zep_preboot_readme.txt", "");
  EXPECT_TRUE(TOSSpecific::isOEMBuild());
  fs::current_path("docs");
  EXPECT_FALSE(TOSSpecific::isOEMBuild());
  fs::current_path(old);
}

}  // namespace
}  // namespace NQRVZEP20
