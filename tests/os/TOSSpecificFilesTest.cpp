// SPDX-License-Identifier: Apache-2.0
#include "TOSSpecific.h"
#include "tests/os/HostTools.h"

#include <dirent.h>
#include <fcntl.h>
#include <gmock/gmock.h>
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
using TEntries = std::vector<std::string>;
using TNames = std::vector<std::string>;

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
    std::string fPath;
    bool fIsFile, fIsDir;
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
    SCOPED_TRACE(row.fPath);
    EXPECT_EQ(TOSSpecific::FileExists(row.fPath), row.fIsFile);
    EXPECT_EQ(TOSSpecific::DirExists(row.fPath), row.fIsDir);
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
    mode_t fMask, fMode;
  };
  for (TRow const row : {TRow{0, 0777}, TRow{022, 0755}, TRow{027, 0750}, TRow{0777, 0}}) {
    std::string const path = fDir.Path("mask" + std::to_string(row.fMask));
    mode_t const old = ::umask(row.fMask);
    TOSSpecific::CreateDir(path);
    ::umask(old);
    struct stat status;
    ASSERT_EQ(::stat(path.c_str(), &status), 0);
    EXPECT_EQ(status.st_mode & 07777, row.fMode) << "umask " << row.fMask;
  }
}

TEST_F(TOSSpecificFilesTest, CreateDirThrowsTheStatusOfItsFailure) {
  WriteFile(fDir.Path("file"), "");
  fs::create_directory(fDir.Path("dir"));
  fs::create_symlink("nowhere", fDir.Path("dangling"));
  struct TRow {
    std::string fPath;
    EZEPStatusCode fStatus;
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
    SCOPED_TRACE(row.fPath);
    EXPECT_STATUS(TOSSpecific::CreateDir(row.fPath), row.fStatus);
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

// A directory that every user may use, for children that run as another user.
class FilesTest : public testing::Test {
protected:
  FilesTest() { fs::permissions(fDir.Path(), fs::perms::all); }
  TTempDir fDir;
};

// ---- GetFileSize ----

TEST_F(FilesTest, SizeIsThatOfTheFile) {
  WriteFile(fDir.Path("empty"), "");
  WriteFile(fDir.Path("file"), "12345");
  fs::create_symlink("file", fDir.Path("link"));
  TUniqueFd const sparse(::open(fDir.Path("sparse").c_str(), O_WRONLY | O_CREAT, 0600));
  ASSERT_EQ(::ftruncate(sparse.get(), 5000000000), 0);
  EXPECT_EQ(TOSSpecific::GetFileSize(fDir.Path("empty")), 0);
  EXPECT_EQ(TOSSpecific::GetFileSize(fDir.Path("file")), 5);
  EXPECT_EQ(TOSSpecific::GetFileSize(fDir.Path("link")), 5);
  EXPECT_EQ(TOSSpecific::GetFileSize(fDir.Path("sparse")), 5000000000);
  EXPECT_EQ(TOSSpecific::GetFileSize("/dev/null"), 0);
}

TEST_F(FilesTest, OnlyAFileHasASize) {
  fs::create_symlink("nowhere", fDir.Path("dangling"));
  for (std::string const& path : {fDir.Path("missing"), fDir.Path(), fDir.Path("dangling"), std::string()})
    EXPECT_STATUS(TOSSpecific::GetFileSize(path), kZEPStatusFileNotFound) << path;
}

// ---- ListDir ----

TEST_F(FilesTest, ListsEveryNameButTheTwoDots) {
  fs::create_directories(fDir.Path("list/dir"));
  fs::create_symlink("nowhere", fDir.Path("list/dangling"));
  for (char const* name : {"file", ".hidden", "...", "two words", "n\new", "\xff"}) WriteFile(fDir.Path("list/") + name, "");
  EXPECT_THAT(TOSSpecific::ListDir(fDir.Path("list")),
              testing::UnorderedElementsAre("dir", "dangling", "file", ".hidden", "...", "two words", "n\new", "\xff"));
  EXPECT_EQ(TOSSpecific::ListDir(fDir.Path("list/dir")), TNames{});
}

TEST_F(FilesTest, ListIsInTheOrderOfTheSystem) {
  for (int i = 0; i < 1000; ++i) WriteFile(fDir.Path(std::to_string(i * 7919 % 1000)), "");
  TNames expected;
  TUniqueDir const dir(::opendir(fDir.Path().c_str()));
  while (dirent const* const entry = ::readdir(dir.get()))
    if (std::string const name = entry->d_name; name != "." && name != "..") expected.push_back(name);
  EXPECT_EQ(expected.size(), 1000u);
  EXPECT_EQ(TOSSpecific::ListDir(fDir.Path()), expected);
}

TEST_F(FilesTest, OnlyADirectoryCanBeListed) {
  int const before = OpenDescriptors();
  WriteFile(fDir.Path("file"), "");
  for (std::string const& path : {fDir.Path("missing"), fDir.Path("file"), std::string()})
    EXPECT_STATUS(TOSSpecific::ListDir(path), kZEPStatusFileSystemError) << path;
  TOSSpecific::ListDir(fDir.Path());
  EXPECT_EQ(OpenDescriptors(), before);
}

// ---- FindFile ----

TEST_F(FilesTest, FindFileReturnsTheLinesOfFind) {
  fs::create_directories(fDir.Path("tree/below"));
  WriteFile(fDir.Path("tree/below/file"), "");
  WriteFile(fDir.Path("tree/two words"), "");
  EXPECT_THAT(TOSSpecific::FindFile(fDir.Path("tree")),
              testing::UnorderedElementsAre(fDir.Path("tree"), fDir.Path("tree/below"), fDir.Path("tree/below/file"),
                                            fDir.Path("tree/two words")));
  EXPECT_EQ(LogOf([&] { TOSSpecific::FindFile(fDir.Path("tree")); }), (TEntries{"[Debug] SpawnProcess: process find"}));
}

TEST_F(FilesTest, FindFileReturnsTheOutputOfFindLineByLine) {
  WriteFile(fDir.Path("find"), "#!/bin/sh\n[ $# = 1 ] && printf \"$1\"\n");
  fs::permissions(fDir.Path("find"), fs::perms::all);
  TEnvironmentGuard const path("PATH", (fDir.Path() + ":/usr/bin:/bin").c_str());
  struct TRow {
    std::string fOutput;
    TNames fLines;
  };
  TRow const rows[] = {
      {"", {}},
      {"one", {"one"}},
      {"one\\n", {"one"}},
      {"one\\ntwo", {"one", "two"}},
      {"one\\n\\ntwo\\n", {"one", "", "two"}},
      {"\\n", {""}},
      {"a b\\r\\n", {"a b\r"}},
  };
  for (TRow const& row : rows) EXPECT_EQ(TOSSpecific::FindFile(row.fOutput), row.fLines) << row.fOutput;
}

TEST_F(FilesTest, AnErrorMessageOfFindIsALineAsWell) {
  TNames const lines = TOSSpecific::FindFile(fDir.Path("missing"));
  ASSERT_EQ(lines.size(), 1u);
  EXPECT_NE(lines[0].find("No such file or directory"), std::string::npos) << lines[0];
}

// ---- deleteFile ----

TEST_F(FilesTest, DeleteFileIsAlwaysTrue) {
  WriteFile(fDir.Path("file"), "");
  EXPECT_EQ(LogOf([&] { EXPECT_TRUE(TOSSpecific::deleteFile(fDir.Path("file"))); }),
            (TEntries{"[Debug] Entering TOSSpecific::deleteFile, path=" + fDir.Path("file"),
                      "[Debug] Exiting TOSSpecific::deleteFile"}));
  EXPECT_FALSE(fs::exists(fDir.Path("file")));
  EXPECT_TRUE(TOSSpecific::deleteFile(fDir.Path("file")));  // is deleted already
  testing::internal::CaptureStderr();
  EXPECT_TRUE(TOSSpecific::deleteFile(fDir.Path()));  // a directory
  EXPECT_NE(testing::internal::GetCapturedStderr(), "");
  EXPECT_TRUE(fs::exists(fDir.Path()));
}

TEST_F(FilesTest, DeleteFileAcceptsShellPatternsAndQuotesNothing) {
  for (char const* name : {"a1", "a2", "b1", "two", "words"}) WriteFile(fDir.Path(name), "");
  TOSSpecific::deleteFile(fDir.Path("a*"));
  EXPECT_THAT(TOSSpecific::ListDir(fDir.Path()), testing::UnorderedElementsAre("b1", "two", "words"));
  TWorkingDirectory const directory(fDir.Path());
  TOSSpecific::deleteFile("two words");
  EXPECT_THAT(TOSSpecific::ListDir(fDir.Path()), testing::UnorderedElementsAre("b1"));
  TOSSpecific::deleteFile("none; : > made-by-the-shell");
  EXPECT_TRUE(fs::exists("made-by-the-shell"));
}

// ---- createFile ----

TEST_F(FilesTest, CreateFileWritesTheContents) {
  int const before = OpenDescriptors();
  std::string const path = fDir.Path("file");
  for (std::string const& contents :
       {std::string("a longer text"), std::string("short"), std::string(), std::string("zero\0byte", 9), TextOf(1000000)}) {
    EXPECT_TRUE(TOSSpecific::createFile(path, contents));
    EXPECT_EQ(ReadFile(path), contents);
  }
  EXPECT_EQ(OpenDescriptors(), before);
  EXPECT_EQ(LogOf([&] { TOSSpecific::createFile(path, "text"); }),
            (TEntries{"[Debug] Entering TOSSpecific::createFile, path=" + path, "[Debug] Successfully created file: " + path,
                      "[Debug] Exiting TOSSpecific::createFile"}));
}

TEST_F(FilesTest, CreatedFileIsForItsOwnerToWrite) {
  for (mode_t const mask : {0u, 022u, 077u}) {
    TUmask const umask(mask);
    std::string const path = fDir.Path("mask" + std::to_string(mask));
    TOSSpecific::createFile(path, "");
    EXPECT_EQ(ModeOf(path), 0644u & ~mask);
  }
}

TEST_F(FilesTest, CreateFileThatCannotBeOpenedIsFalseWithTheReasonAtDebug) {
  WriteFile(fDir.Path("write-only"), "old");  // it is opened for reading as well
  fs::permissions(fDir.Path("write-only"), static_cast<fs::perms>(0222));
  EXPECT_EQ(InChild([&] {
              if (!BecomeUnprivileged()) return std::string("still root");
              return std::string(TOSSpecific::createFile(fDir.Path("write-only"), "new") ? "created" : "not created");
            }),
            "not created");
  EXPECT_EQ(ReadFile(fDir.Path("write-only")), "old");

  std::string const path = fDir.Path("missing/file");
  EXPECT_EQ(LogOf([&] { EXPECT_FALSE(TOSSpecific::createFile(path, "text")); }),
            (TEntries{"[Debug] Entering TOSSpecific::createFile, path=" + path, "[Debug] Unable to create file, errno=2"}));
  EXPECT_EQ(
      LogOf([&] { EXPECT_FALSE(TOSSpecific::createFile(fDir.Path(), "text")); }),
      (TEntries{"[Debug] Entering TOSSpecific::createFile, path=" + fDir.Path(), "[Debug] Unable to create file, errno=21"}));
}

TEST_F(FilesTest, CreateFileIgnoresTheResultOfItsWrite) {
  EXPECT_TRUE(TOSSpecific::createFile("/dev/full", "no room for this"));
  NEEDS(MayMount(), "leave to mount a file system");
  TTempDir const small;
  EXPECT_EQ(InChild([&] {
              if (!MountTmpfs(small.Path(), "size=64k")) return std::string("not mounted");
              bool const made = TOSSpecific::createFile(small.Path("file"), TextOf(200000));
              return std::string(made ? "true, " : "false, ") + std::to_string(TOSSpecific::GetFileSize(small.Path("file")));
            }),
            "true, 65536");
}

// ---- OpenOutputFileStream ----

TEST_F(FilesTest, StreamIsOpenedAndTheFileTruncated) {
  WriteFile(fDir.Path("file"), "old text");
  std::ofstream stream;
  EXPECT_EQ(LogOf([&] { TOSSpecific::OpenOutputFileStream(stream, fDir.Path("file")); }),
            (TEntries{"[Debug] TOSSpecific::OpenOutputFileStream -- Entering ",
                      "[Debug] TOSSpecific::OpenOutputFileStream -- Exting "}));
  EXPECT_EQ(ReadFile(fDir.Path("file")), "");
  stream << "new" << std::flush;
  EXPECT_EQ(ReadFile(fDir.Path("file")), "new");
}

TEST_F(FilesTest, StreamThatIsOpenIsClosedFirst) {
  std::ofstream stream(fDir.Path("first"));
  stream << "first";
  stream.setstate(std::ios::failbit | std::ios::eofbit);
  TOSSpecific::OpenOutputFileStream(stream, fDir.Path("second"));
  EXPECT_EQ(ReadFile(fDir.Path("first")), "first");
  EXPECT_TRUE(stream.good());
  stream << "second" << std::flush;
  EXPECT_EQ(ReadFile(fDir.Path("second")), "second");
}

TEST_F(FilesTest, AFailedStreamCanBeOpenedAgain) {
  std::ofstream stream;
  EXPECT_STATUS(TOSSpecific::OpenOutputFileStream(stream, fDir.Path("missing/file")), kZEPStatusFileSystemError);
  EXPECT_TRUE(stream.fail());
  EXPECT_NO_THROW(TOSSpecific::OpenOutputFileStream(stream, fDir.Path("file")));
  EXPECT_TRUE(stream.good());
}

TEST_F(FilesTest, StreamThatCannotBeOpenedThrows) {
  std::ofstream stream;
  for (std::string const& path : {fDir.Path("missing/file"), fDir.Path(), std::string()})
    EXPECT_EQ(LogOf([&] { EXPECT_STATUS(TOSSpecific::OpenOutputFileStream(stream, path), kZEPStatusFileSystemError); }),
              (TEntries{"[Debug] TOSSpecific::OpenOutputFileStream -- Entering ",
                        "[Error] TOSSpecific::OpenOutputFileStream --  Failed to open output file: " + path}));
  WriteFile(fDir.Path("closed"), "");
  ::chmod(fDir.Path("closed").c_str(), 0444);
  EXPECT_EQ(InChild([&] {
              if (!BecomeUnprivileged()) return "still root";
              std::ofstream other;
              TOSSpecific::OpenOutputFileStream(other, fDir.Path("closed"));
              return "opened";
            }),
            "threw kZEPStatusAccessDenied");
}

TEST_F(FilesTest, ReasonOfAStreamThatCannotBeOpenedTravelsWithTheFailure) {
  std::ofstream stream;
  std::string const path = fDir.Path("missing/file");
  EXPECT_EQ(ReasonOf([&] { TOSSpecific::OpenOutputFileStream(stream, path); }), "Failed to open output file: " + path);
}

TEST_F(FilesTest, AThrowingStreamFailsWithTheStatusAndKeepsItsMask) {
  constexpr std::ios::iostate kMasks[] = {std::ios::failbit, std::ios::badbit, std::ios::failbit | std::ios::badbit,
                                          std::ios::failbit | std::ios::badbit | std::ios::eofbit};
  for (std::ios::iostate const mask : kMasks) {
    SCOPED_TRACE(mask);
    std::ofstream stream;
    stream.exceptions(mask);
    std::string const path = fDir.Path("missing/file");
    EXPECT_EQ(LogOf([&] { EXPECT_STATUS(TOSSpecific::OpenOutputFileStream(stream, path), kZEPStatusFileSystemError); }),
              (TEntries{"[Debug] TOSSpecific::OpenOutputFileStream -- Entering ",
                        "[Error] TOSSpecific::OpenOutputFileStream --  Failed to open output file: " + path}));
    EXPECT_EQ(stream.exceptions(), mask);
    EXPECT_EQ(stream.rdstate(), std::ios::failbit);

    TOSSpecific::OpenOutputFileStream(stream, fDir.Path("file"));
    EXPECT_EQ(stream.exceptions(), mask);
    EXPECT_TRUE(stream.good());
  }
}

TEST_F(FilesTest, AThrowingStreamIsClosedFirstEvenWhenItsOldFileFails) {
  std::ofstream stream("/dev/full");
  stream.exceptions(std::ios::failbit | std::ios::badbit);
  stream << "never written";  // which closing the file finds out
  EXPECT_NO_THROW(TOSSpecific::OpenOutputFileStream(stream, fDir.Path("file")));
  EXPECT_EQ(stream.exceptions(), std::ios::failbit | std::ios::badbit);
  stream << "new" << std::flush;
  EXPECT_EQ(ReadFile(fDir.Path("file")), "new");
}

}  // namespace
}  // namespace NQRVZEP20
