// SPDX-License-Identifier: Apache-2.0

// Copies, lists, finds, makes and deletes files, and opens streams on them.

#include "TOSSpecific.h"
#include "core/Handles.h"
#include "tests/os/HostTools.h"

#include <fcntl.h>
#include <gmock/gmock.h>
#include <sys/resource.h>
#include <sys/stat.h>

#include <map>

namespace NQRVZEP20 {
namespace {

namespace fs = std::filesystem;
using TEntries = std::vector<std::string>;
using TNames = std::vector<std::string>;

mode_t ModeOf(std::string const& path) {
  struct stat status {};
  ::stat(path.c_str(), &status);
  return status.st_mode & 07777;
}

class TUmask {
public:
  explicit TUmask(mode_t mask) : fOld(::umask(mask)) {}
  ~TUmask() { ::umask(fOld); }

private:
  mode_t fOld;
};

std::string TextOf(std::size_t size) {
  std::string text(size, ' ');
  for (std::size_t i = 0; i < size; ++i) text[i] = static_cast<char>(i * 31 + i / 256);
  return text;
}

// A directory that everybody may use, for what a child does as another user.
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

TEST_F(FilesTest, WhatIsNoFileHasNoSize) {
  fs::create_symlink("nowhere", fDir.Path("dangling"));
  for (std::string const& path : {fDir.Path("missing"), fDir.Path(), fDir.Path("dangling"), std::string()})
    EXPECT_STATUS(TOSSpecific::GetFileSize(path), kZEPStatusFileNotFound) << path;
}

// ---- FileCopy ----

TEST_F(FilesTest, CopyHasTheContentsOfTheSource) {
  int const before = OpenDescriptors();
  for (std::size_t const size : {0u, 1u, 32767u, 32768u, 32769u, 65536u, 1048575u, 1048576u, 1048577u, 3000000u}) {
    SCOPED_TRACE(size);
    std::string const to = fDir.Path("copy" + std::to_string(size));
    WriteFile(fDir.Path("source"), TextOf(size));
    TOSSpecific::FileCopy(fDir.Path("source"), to);
    EXPECT_EQ(ReadFile(to), TextOf(size));
    EXPECT_EQ(ReadFile(fDir.Path("source")), TextOf(size));
  }
  EXPECT_EQ(OpenDescriptors(), before);
}

TEST_F(FilesTest, DestinationIsNotTruncated) {
  WriteFile(fDir.Path("source"), "0123456789");
  WriteFile(fDir.Path("destination"), "abcdefghijklmnopqrst");
  TOSSpecific::FileCopy(fDir.Path("source"), fDir.Path("destination"));
  EXPECT_EQ(ReadFile(fDir.Path("destination")), "0123456789klmnopqrst");

  WriteFile(fDir.Path("source"), "");
  TOSSpecific::FileCopy(fDir.Path("source"), fDir.Path("destination"));
  EXPECT_EQ(ReadFile(fDir.Path("destination")), "0123456789klmnopqrst");

  WriteFile(fDir.Path("source"), TextOf(2000000));
  WriteFile(fDir.Path("destination"), std::string(3000000, 'x'));
  TOSSpecific::FileCopy(fDir.Path("source"), fDir.Path("destination"));
  EXPECT_EQ(ReadFile(fDir.Path("destination")), TextOf(2000000) + std::string(1000000, 'x'));
}

TEST_F(FilesTest, NewDestinationHasThePermissionsOfTheSourceLessTheUmask) {
  struct TRow {
    mode_t source, mask, copy;
  };
  for (TRow const row :
       {TRow{0644, 0, 0644}, TRow{0755, 022, 0755}, TRow{0777, 022, 0755}, TRow{0666, 077, 0600}, TRow{0400, 0, 0400}}) {
    SCOPED_TRACE(row.source);
    std::string const from = fDir.Path("source" + std::to_string(row.source)), to = from + ".copy";
    WriteFile(from, "text");
    ::chmod(from.c_str(), row.source);
    TUmask const mask(row.mask);
    TOSSpecific::FileCopy(from, to);
    EXPECT_EQ(ModeOf(to), row.copy);
    EXPECT_EQ(ReadFile(to), "text");
  }
}

TEST_F(FilesTest, ExistingDestinationKeepsItsPermissions) {
  WriteFile(fDir.Path("source"), "text");
  WriteFile(fDir.Path("destination"), "");
  ::chmod(fDir.Path("source").c_str(), 0777);
  ::chmod(fDir.Path("destination").c_str(), 0600);
  TOSSpecific::FileCopy(fDir.Path("source"), fDir.Path("destination"));
  EXPECT_EQ(ModeOf(fDir.Path("destination")), 0600u);
}

TEST_F(FilesTest, CopyFollowsLinksAtBothEnds) {
  WriteFile(fDir.Path("source"), "text");
  WriteFile(fDir.Path("destination"), "");
  fs::create_symlink("source", fDir.Path("linkToSource"));
  fs::create_symlink("destination", fDir.Path("linkToDestination"));
  TOSSpecific::FileCopy(fDir.Path("linkToSource"), fDir.Path("linkToDestination"));
  EXPECT_EQ(ReadFile(fDir.Path("destination")), "text");
  EXPECT_TRUE(fs::is_symlink(fDir.Path("linkToDestination")));
}

TEST_F(FilesTest, AFileCopiedOntoItselfStaysAsItWas) {
  for (std::size_t const size : {1000u, 100000u, 2000000u}) {
    WriteFile(fDir.Path("file"), TextOf(size));
    TOSSpecific::FileCopy(fDir.Path("file"), fDir.Path("file"));
    EXPECT_EQ(ReadFile(fDir.Path("file")), TextOf(size));
  }
}

TEST_F(FilesTest, PseudoFilesAndDevicesAreCopied) {
  TOSSpecific::FileCopy("/proc/version", fDir.Path("version"));  // of size 0, it says
  EXPECT_EQ(ReadFile(fDir.Path("version")), ReadFile("/proc/version"));
  WriteFile(fDir.Path("source"), TextOf(2000000));
  EXPECT_NO_THROW(TOSSpecific::FileCopy(fDir.Path("source"), "/dev/null"));

  ASSERT_EQ(::mkfifo(fDir.Path("pipe").c_str(), 0600), 0);
  std::thread writer([this] { WriteFile(fDir.Path("pipe"), TextOf(200000)); });
  TOSSpecific::FileCopy(fDir.Path("pipe"), fDir.Path("fromPipe"));
  writer.join();
  EXPECT_EQ(ReadFile(fDir.Path("fromPipe")), TextOf(200000));

  std::string arrived;
  std::thread reader([&] { arrived = ReadFile(fDir.Path("pipe")); });
  EXPECT_NO_THROW(TOSSpecific::FileCopy(fDir.Path("source"), fDir.Path("pipe")));
  reader.join();
  EXPECT_EQ(arrived, TextOf(2000000));
}

TEST_F(FilesTest, CopyThrowsWhenAnEndCannotBeOpened) {
  WriteFile(fDir.Path("source"), "text");
  int const before = OpenDescriptors();
  EXPECT_STATUS(TOSSpecific::FileCopy(fDir.Path("missing"), fDir.Path("copy")), kZEPStatusFileSystemError);
  EXPECT_FALSE(fs::exists(fDir.Path("copy")));
  EXPECT_STATUS(TOSSpecific::FileCopy(fDir.Path("source"), fDir.Path("missing/copy")), kZEPStatusFileSystemError);
  EXPECT_STATUS(TOSSpecific::FileCopy(fDir.Path("source"), fDir.Path()), kZEPStatusFileSystemError);
  EXPECT_STATUS(TOSSpecific::FileCopy(fDir.Path(), fDir.Path("copy")), kZEPStatusFileSystemError);  // opens, but cannot be read
  EXPECT_EQ(OpenDescriptors(), before);

  ::chmod(fDir.Path("source").c_str(), 0);
  WriteFile(fDir.Path("open"), "text");
  WriteFile(fDir.Path("closed"), "old");
  ::chmod(fDir.Path("open").c_str(), 0444);
  ::chmod(fDir.Path("closed").c_str(), 0444);
  auto const copyUnprivileged = [this](char const* from, char const* to) {
    return InChild([&] {
      if (!BecomeUnprivileged()) return "still root";
      TOSSpecific::FileCopy(fDir.Path(from), fDir.Path(to));
      return "copied";
    });
  };
  EXPECT_EQ(copyUnprivileged("source", "copy"), "threw kZEPStatusFileSystemError");
  EXPECT_EQ(copyUnprivileged("open", "closed"), "threw kZEPStatusFileSystemError");
  EXPECT_EQ(ReadFile(fDir.Path("closed")), "old");
  EXPECT_EQ(copyUnprivileged("open", "new"), "copied");
}

TEST_F(FilesTest, CopyToAFullDiskThrowsAndLeavesWhatFitted) {
  NEEDS(MayMount(), "leave to mount a file system");
  for (std::size_t const size : {200000u, 2000000u}) {
    SCOPED_TRACE(size);
    WriteFile(fDir.Path("source"), TextOf(size));
    TTempDir const small;
    EXPECT_EQ(InChild([&] {
                if (!MountTmpfs(small.Path(), "size=64k")) return std::string("not mounted");
                std::string result;
                try {
                  TOSSpecific::FileCopy(fDir.Path("source"), small.Path("copy"));
                } catch (TZEPException const& thrown) {
                  result = thrown.what();
                }
                return result + (ReadFile(small.Path("copy")) == TextOf(size).substr(0, 65536) ? ", 64 KiB copied" : ", else");
              }),
              "kZEPStatusFileSystemError, 64 KiB copied");
  }
}

TEST_F(FilesTest, ALastChunkOfWhichOnlyAPartFittedIsACopy) {
  NEEDS(MayMount(), "leave to mount a file system");
  for (std::size_t const room : {std::size_t{192} << 10, std::size_t{2} << 20}) {
    std::size_t const size = room + 5000;  // of its last chunk, 5,000 bytes, 4,096 find room
    SCOPED_TRACE(size);
    WriteFile(fDir.Path("source"), TextOf(size));
    TTempDir const small;
    std::string const mountSize = "size=" + std::to_string(room + 4096);
    EXPECT_EQ(InChild([&] {
                if (!MountTmpfs(small.Path(), mountSize.c_str())) return std::string("not mounted");
                TOSSpecific::FileCopy(fDir.Path("source"), small.Path("copy"));
                return std::to_string(ReadFile(small.Path("copy")).size());
              }),
              std::to_string(room + 4096));
  }
}

TEST_F(FilesTest, CopyBeyondTheLargestSizeOfAFileThrowsAndLeavesWhatFitted) {
  for (std::size_t const size : {200000u, 2000000u}) {
    SCOPED_TRACE(size);
    WriteFile(fDir.Path("source"), TextOf(size));
    EXPECT_EQ(InChild([&] {
                rlimit const limit{100000, 100000};
                ::signal(SIGXFSZ, SIG_IGN);
                ::setrlimit(RLIMIT_FSIZE, &limit);
                TOSSpecific::FileCopy(fDir.Path("source"), fDir.Path("copy"));
                return "copied";
              }),
              "threw kZEPStatusFileSystemError");
    EXPECT_EQ(ReadFile(fDir.Path("copy")), TextOf(size).substr(0, 100000));
    fs::remove(fDir.Path("copy"));
  }
}

// ---- DirCopy ----

// Every file below a directory with its text; a directory is "/".
std::map<std::string, std::string> TreeOf(std::string const& path) {
  std::map<std::string, std::string> tree;
  for (auto const& entry : fs::recursive_directory_iterator(path))
    tree[entry.path().lexically_relative(path)] = entry.is_directory() ? "/" : ReadFile(entry.path());
  return tree;
}

class DirCopyTest : public FilesTest {
protected:
  DirCopyTest() {
    fs::create_directories(fDir.Path("from/below/deep"));
    fs::create_directories(fDir.Path("from/empty"));
    WriteFile(fDir.Path("from/a"), "file a");
    WriteFile(fDir.Path("from/.hidden"), "hidden");
    WriteFile(fDir.Path("from/below/b"), "file b");
    WriteFile(fDir.Path("from/below/deep/c"), "file c");
  }
  std::map<std::string, std::string> const kWhole = {{".hidden", "hidden"}, {"a", "file a"},     {"below", "/"},
                                                     {"below/b", "file b"}, {"below/deep", "/"}, {"below/deep/c", "file c"},
                                                     {"empty", "/"}};
  std::map<std::string, std::string> const kFlat = {{".hidden", "hidden"}, {"a", "file a"}};
};

TEST_F(DirCopyTest, CopiesTheFilesAndWhenRecursiveTheDirectories) {
  EXPECT_EQ(TOSSpecific::DirCopy(fDir.Path("from"), fDir.Path("flat"), false), 0);
  EXPECT_EQ(TreeOf(fDir.Path("flat")), kFlat);
  EXPECT_EQ(TOSSpecific::DirCopy(fDir.Path("from"), fDir.Path("whole"), true), 0);
  EXPECT_EQ(TreeOf(fDir.Path("whole")), kWhole);
}

TEST_F(DirCopyTest, ATrailingSeparatorMakesNoDifference) {
  int i = 0;
  for (char const* from : {"from", "from/", "from//"})
    for (char const* ending : {"", "/", "//"}) {
      std::string const to = fDir.Path("to" + std::to_string(i++));
      EXPECT_EQ(TOSSpecific::DirCopy(fDir.Path(from), to + ending, true), 0);
      EXPECT_EQ(TreeOf(to), kWhole);
    }
}

TEST_F(DirCopyTest, CopiesIntoADirectoryThatIsThere) {
  fs::create_directories(fDir.Path("to/below"));
  WriteFile(fDir.Path("to/own"), "own");
  WriteFile(fDir.Path("to/a"), "longer than file a");
  EXPECT_EQ(TOSSpecific::DirCopy(fDir.Path("from"), fDir.Path("to"), false), 0);
  EXPECT_EQ(TreeOf(fDir.Path("to")), (std::map<std::string, std::string>{
                                         {".hidden", "hidden"}, {"a", "file a than file a"}, {"below", "/"}, {"own", "own"}}));
}

TEST_F(DirCopyTest, MakesOneLevelOnly) {
  EXPECT_STATUS(TOSSpecific::DirCopy(fDir.Path("from"), fDir.Path("missing/to"), true), kZEPStatusFileSystemError);
  EXPECT_FALSE(fs::exists(fDir.Path("missing")));
}

TEST_F(DirCopyTest, FollowsLinksAndPassesOverThoseToNothing) {
  fs::create_directory(fDir.Path("elsewhere"));
  WriteFile(fDir.Path("elsewhere/d"), "file d");
  fs::create_symlink("../elsewhere/d", fDir.Path("from/linkToFile"));
  fs::create_symlink("../elsewhere", fDir.Path("from/linkToDir"));
  fs::create_symlink("nowhere", fDir.Path("from/dangling"));
  auto whole = kWhole, flat = kFlat;
  whole["linkToFile"] = flat["linkToFile"] = "file d";
  whole["linkToDir"] = "/";
  whole["linkToDir/d"] = "file d";
  EXPECT_EQ(TOSSpecific::DirCopy(fDir.Path("from"), fDir.Path("flat"), false), 0);
  EXPECT_EQ(TreeOf(fDir.Path("flat")), flat);
  EXPECT_EQ(TOSSpecific::DirCopy(fDir.Path("from"), fDir.Path("whole"), true), 0);
  EXPECT_EQ(TreeOf(fDir.Path("whole")), whole);
  EXPECT_FALSE(fs::is_symlink(fDir.Path("whole/linkToFile")));
  EXPECT_FALSE(fs::is_symlink(fDir.Path("whole/linkToDir")));
}

TEST_F(DirCopyTest, ThrowsWhenADirectoryCannotBeOpened) {
  int const before = OpenDescriptors();
  for (std::string const& from : {fDir.Path("missing"), fDir.Path("from/a")}) {
    EXPECT_STATUS(TOSSpecific::DirCopy(from, fDir.Path("to"), true), kZEPStatusFileSystemError);
    EXPECT_FALSE(fs::exists(fDir.Path("to"))) << "the destination is made only when the source is open";
  }
  EXPECT_EQ(OpenDescriptors(), before);
}

TEST_F(DirCopyTest, WhatCreateDirAndFileCopyThrowPassesThrough) {
  int const before = OpenDescriptors();
  WriteFile(fDir.Path("file"), "");
  EXPECT_STATUS(TOSSpecific::DirCopy(fDir.Path("from"), fDir.Path("file"), true), kZEPStatusDirectoryAlreadyExists);
  fs::create_directories(fDir.Path("to/a"));  // where the file "a" is to be
  EXPECT_STATUS(TOSSpecific::DirCopy(fDir.Path("from"), fDir.Path("to"), false), kZEPStatusFileSystemError);
  EXPECT_EQ(OpenDescriptors(), before);

  fs::create_directory(fDir.Path("closed"), fDir.Path());
  ::chmod(fDir.Path("closed").c_str(), 0555);
  EXPECT_EQ(InChild([&] {
              if (!BecomeUnprivileged()) return "still root";
              TOSSpecific::DirCopy(fDir.Path("from"), fDir.Path("closed/to"), true);
              return "copied";
            }),
            "threw kZEPStatusAccessDenied");
}

TEST_F(DirCopyTest, WhatWasCopiedBeforeAFailureStays) {
  fs::create_directory(fDir.Path("one"));
  for (char const* name : {"a", "b", "c"}) WriteFile(fDir.Path("one/") + name, name);
  TEntries const names = TOSSpecific::ListDir(fDir.Path("one"));
  fs::create_directories(fDir.Path("two/") + names.back());  // where the last file is to be
  EXPECT_STATUS(TOSSpecific::DirCopy(fDir.Path("one"), fDir.Path("two"), true), kZEPStatusFileSystemError);
  EXPECT_EQ(ReadFile(fDir.Path("two/") + names[0]), names[0]);
  EXPECT_EQ(ReadFile(fDir.Path("two/") + names[1]), names[1]);
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

TEST_F(FilesTest, WhatIsNoDirectoryCannotBeListed) {
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

TEST_F(FilesTest, FindFileHandsOnWhatFindPrintsLineByLine) {
  WriteFile(fDir.Path("find"), "#!/bin/sh\n[ $# = 1 ] && printf \"$1\"\n");
  fs::permissions(fDir.Path("find"), fs::perms::all);
  TEnvironmentGuard const path("PATH", (fDir.Path() + ":/usr/bin:/bin").c_str());
  struct TRow {
    std::string output;
    TNames lines;
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
  for (TRow const& row : rows) EXPECT_EQ(TOSSpecific::FindFile(row.output), row.lines) << row.output;
}

TEST_F(FilesTest, FindsComplaintIsALineAsWell) {
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
  EXPECT_TRUE(TOSSpecific::deleteFile(fDir.Path("file")));  // is gone already
  testing::internal::CaptureStderr();
  EXPECT_TRUE(TOSSpecific::deleteFile(fDir.Path()));  // a directory
  EXPECT_NE(testing::internal::GetCapturedStderr(), "");
  EXPECT_TRUE(fs::exists(fDir.Path()));
}

TEST_F(FilesTest, DeleteFileTakesShellPatternsAndQuotesNothing) {
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

TEST_F(FilesTest, CreateFileDoesNotAskWhetherTheContentsArrived) {
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

TEST_F(FilesTest, StreamThatFailedBeforeOpensAllTheSame) {
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

TEST_F(FilesTest, StreamThatThrowsByItselfFailsWithTheStatusAndKeepsItsMask) {
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

TEST_F(FilesTest, StreamThatThrowsByItselfIsClosedFirstWhateverBecomesOfItsOldFile) {
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
