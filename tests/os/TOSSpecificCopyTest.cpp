// SPDX-License-Identifier: Apache-2.0

// Copies files and directories.

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

// A directory that every user may use, for children that run as another user.
class FileCopyTest : public testing::Test {
protected:
  FileCopyTest() { fs::permissions(fDir.Path(), fs::perms::all); }
  TTempDir fDir;
};

// ---- FileCopy ----

TEST_F(FileCopyTest, CopyHasTheContentsOfTheSource) {
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

TEST_F(FileCopyTest, DestinationIsNotTruncated) {
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

TEST_F(FileCopyTest, NewDestinationHasThePermissionsOfTheSourceLessTheUmask) {
  struct TRow {
    mode_t fSource, fMask, fCopy;
  };
  for (TRow const row :
       {TRow{0644, 0, 0644}, TRow{0755, 022, 0755}, TRow{0777, 022, 0755}, TRow{0666, 077, 0600}, TRow{0400, 0, 0400}}) {
    SCOPED_TRACE(row.fSource);
    std::string const from = fDir.Path("source" + std::to_string(row.fSource)), to = from + ".copy";
    WriteFile(from, "text");
    ::chmod(from.c_str(), row.fSource);
    TUmask const mask(row.fMask);
    TOSSpecific::FileCopy(from, to);
    EXPECT_EQ(ModeOf(to), row.fCopy);
    EXPECT_EQ(ReadFile(to), "text");
  }
}

TEST_F(FileCopyTest, ExistingDestinationKeepsItsPermissions) {
  WriteFile(fDir.Path("source"), "text");
  WriteFile(fDir.Path("destination"), "");
  ::chmod(fDir.Path("source").c_str(), 0777);
  ::chmod(fDir.Path("destination").c_str(), 0600);
  TOSSpecific::FileCopy(fDir.Path("source"), fDir.Path("destination"));
  EXPECT_EQ(ModeOf(fDir.Path("destination")), 0600u);
}

TEST_F(FileCopyTest, CopyFollowsLinksAtBothEnds) {
  WriteFile(fDir.Path("source"), "text");
  WriteFile(fDir.Path("destination"), "");
  fs::create_symlink("source", fDir.Path("linkToSource"));
  fs::create_symlink("destination", fDir.Path("linkToDestination"));
  TOSSpecific::FileCopy(fDir.Path("linkToSource"), fDir.Path("linkToDestination"));
  EXPECT_EQ(ReadFile(fDir.Path("destination")), "text");
  EXPECT_TRUE(fs::is_symlink(fDir.Path("linkToDestination")));
}

TEST_F(FileCopyTest, AFileCopiedOntoItselfStaysAsItWas) {
  for (std::size_t const size : {1000u, 100000u, 2000000u}) {
    WriteFile(fDir.Path("file"), TextOf(size));
    TOSSpecific::FileCopy(fDir.Path("file"), fDir.Path("file"));
    EXPECT_EQ(ReadFile(fDir.Path("file")), TextOf(size));
  }
}

TEST_F(FileCopyTest, PseudoFilesAndDevicesAreCopied) {
  TOSSpecific::FileCopy("/proc/version", fDir.Path("version"));  // reports a size of 0
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

TEST_F(FileCopyTest, CopyThrowsWhenAnEndCannotBeOpened) {
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

TEST_F(FileCopyTest, CopyToAFullDiskThrowsAndLeavesThePartThatFitted) {
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

TEST_F(FileCopyTest, ALastChunkOfWhichOnlyAPartFittedIsACopy) {
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

TEST_F(FileCopyTest, CopyBeyondTheFileSizeLimitThrowsAndLeavesThePartThatFitted) {
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

class DirCopyTest : public FileCopyTest {
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

TEST_F(DirCopyTest, CopiesIntoAnExistingDirectory) {
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

TEST_F(DirCopyTest, ExceptionsOfCreateDirAndFileCopyPassThrough) {
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

TEST_F(DirCopyTest, FilesCopiedBeforeAFailureStay) {
  fs::create_directory(fDir.Path("one"));
  for (char const* name : {"a", "b", "c"}) WriteFile(fDir.Path("one/") + name, name);
  TEntries const names = TOSSpecific::ListDir(fDir.Path("one"));
  fs::create_directories(fDir.Path("two/") + names.back());  // where the last file is to be
  EXPECT_STATUS(TOSSpecific::DirCopy(fDir.Path("one"), fDir.Path("two"), true), kZEPStatusFileSystemError);
  EXPECT_EQ(ReadFile(fDir.Path("two/") + names[0]), names[0]);
  EXPECT_EQ(ReadFile(fDir.Path("two/") + names[1]), names[1]);
}

}  // namespace
}  // namespace NQRVZEP20
