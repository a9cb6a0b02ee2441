// SPDX-License-Identifier: Apache-2.0
#include "collect/PlugInFiles.h"

#include "tests/Support.h"

#include <gmock/gmock.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <sys/xattr.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>

namespace NQRVZEP20 {
namespace {

namespace fs = std::filesystem;

class PlugInFilesTest : public testing::Test {
protected:
  // A copy of a plug-in, in that directory below the test's own.
  std::string Copy(std::string const& name) {
    fs::create_directories(fs::path(fDir.Path(name)).parent_path());
    fs::copy(TEST_PROVIDER, fDir.Path(name));
    return fDir.Path(name);
  }

  static TPlugInFile Tried(std::string const& file, bool allowWritable = false) {
    return FindPlugIns({{file}, allowWritable}).front();
  }

  static std::string RuleOf(std::string const& file) { return NameOf(Tried(file).fRule); }

  TTempDir const fDir;
};

TEST_F(PlugInFilesTest, APlugInThatIsTriedHasTheNameInItsFileName) {
  TPlugInFile const file = Tried(Copy("libFan.nsp.so"));
  EXPECT_TRUE(file.IsLoaded());
  EXPECT_EQ(file.fName, "Fan");
  EXPECT_EQ(file.fReason, "");
  EXPECT_EQ(Tried(Copy("fan.so")).fName, "fan.so");
}

TEST_F(PlugInFilesTest, ARelativePathIsThatOfTheWorkingDirectory) {
  fs::path const before = fs::current_path();
  Copy("libFan.nsp.so");
  fs::current_path(fDir.Path());
  TPlugInFile const file = Tried("libFan.nsp.so");
  fs::current_path(before);
  EXPECT_EQ(file.fFile, fDir.Path("libFan.nsp.so"));
}

TEST_F(PlugInFilesTest, FilesThatCannotBePlugInsArePassedOver) {
  EXPECT_EQ(RuleOf(fDir.Path("libNone.nsp.so")), "missing");

  fs::create_symlink("/nowhere", fDir.Path("libLink.nsp.so"));
  EXPECT_EQ(Tried(fDir.Path("libLink.nsp.so")).fReason, "it is a symbolic link to /nowhere, which does not exist");

  fs::create_directory(fDir.Path("libDirectory.nsp.so"));
  EXPECT_EQ(Tried(fDir.Path("libDirectory.nsp.so")).fReason, "it is a directory");

  ASSERT_EQ(::mkfifo(fDir.Path("libFifo.nsp.so").c_str(), 0600), 0);
  EXPECT_EQ(Tried(fDir.Path("libFifo.nsp.so")).fReason, "it is a FIFO (named pipe)");
  EXPECT_EQ(RuleOf(fDir.Path("libFifo.nsp.so")), "kind");
}

TEST_F(PlugInFilesTest, AnElfFileIsRecognisedByItsBeginning) {
  EXPECT_TRUE(IsElfFile(Copy("libFan.nsp.so")));
  WriteFile(fDir.Path("text"), "#!/bin/sh\n");
  WriteFile(fDir.Path("empty"), "");
  ASSERT_EQ(::mkfifo(fDir.Path("fifo").c_str(), 0600), 0);
  for (char const* name : {"text", "empty", "fifo", "none"}) EXPECT_FALSE(IsElfFile(fDir.Path(name))) << name;
}

TEST_F(PlugInFilesTest, RootLoadsNoPlugInThatOthersMayReplace) {
  NEEDS(::geteuid() == 0, "root");
  std::string const file = Copy("a/b/libFan.nsp.so");
  EXPECT_EQ(RuleOf(file), "");

  ::chmod(file.c_str(), 0666);
  EXPECT_EQ(Tried(file).fReason, "it would run as root, but every user may write " + file);
  EXPECT_TRUE(Tried(file, true).IsLoaded());
  ::chmod(file.c_str(), 0755);

  ASSERT_EQ(::chown(file.c_str(), 0, 1), 0);
  EXPECT_EQ(RuleOf(file), "");
  ::chmod(file.c_str(), 0775);
  EXPECT_EQ(RuleOf(file), "writable") << "its group may write it";
  ASSERT_EQ(::chown(file.c_str(), 0, 0), 0);
  EXPECT_EQ(RuleOf(file), "") << "its group is that of root";

  ASSERT_EQ(::chown(file.c_str(), 1, 0), 0);
  EXPECT_EQ(RuleOf(file), "writable") << "it belongs to another user";
  ASSERT_EQ(::chown(file.c_str(), 0, 0), 0);

  ::chmod(fDir.Path("a").c_str(), 0777);
  EXPECT_EQ(Tried(file).fReason, "it would run as root, but every user may write " + fDir.Path("a"));
  ::chmod(fDir.Path("a").c_str(), 01777);
  EXPECT_EQ(RuleOf(file), "") << "the sticky bit protects what is in the directory";
}

TEST_F(PlugInFilesTest, TheTargetOfALinkIsCheckedToo) {
  NEEDS(::geteuid() == 0, "root");
  std::string const target = Copy("open/libFan.nsp.so");
  fs::create_symlink(target, fDir.Path("libFan.nsp.so"));
  EXPECT_EQ(RuleOf(fDir.Path("libFan.nsp.so")), "");
  ::chmod(fDir.Path("open").c_str(), 0777);
  EXPECT_EQ(RuleOf(fDir.Path("libFan.nsp.so")), "writable");
}

TEST_F(PlugInFilesTest, TheOwnerOfALinkIsChecked) {
  NEEDS(::geteuid() == 0, "root");
  Copy("a/libFan.nsp.so");
  std::string const link = fDir.Path("sticky/libFan.nsp.so");
  fs::create_directory(fDir.Path("sticky"));
  ::chmod(fDir.Path("sticky").c_str(), 01777);
  fs::create_symlink("../a/libFan.nsp.so", link);
  EXPECT_EQ(RuleOf(link), "");
  ASSERT_EQ(::lchown(link.c_str(), 1, 1), 0);
  EXPECT_THAT(Tried(link).fReason, testing::MatchesRegex("it would run as root, but the user .+ owns " + link));
}

TEST_F(PlugInFilesTest, EveryLinkOfAChainIsCheckedWithItsDirectories) {
  NEEDS(::geteuid() == 0, "root");
  Copy("a/libFan.nsp.so");
  std::string const middle = fDir.Path("b/middle"), first = fDir.Path("a/libFirst.nsp.so");
  fs::create_directory(fDir.Path("b"));
  fs::create_symlink("../a/libFan.nsp.so", middle);
  fs::create_symlink("../b/middle", first);
  EXPECT_EQ(RuleOf(first), "");
  ASSERT_EQ(::lchown(middle.c_str(), 1, 1), 0);
  EXPECT_EQ(RuleOf(first), "writable") << "the link in the middle belongs to another user";
  ASSERT_EQ(::lchown(middle.c_str(), 0, 0), 0);
  ::chmod(fDir.Path("b").c_str(), 0777);
  EXPECT_EQ(Tried(first).fReason, "it would run as root, but every user may write " + fDir.Path("b"));
}

TEST_F(PlugInFilesTest, ADirectoryBehindALinkIsCheckedWithThoseAboveIt) {
  NEEDS(::geteuid() == 0, "root");
  Copy("b/c/libFan.nsp.so");
  fs::create_directory_symlink(fDir.Path("b/c"), fDir.Path("a"));
  EXPECT_EQ(RuleOf(fDir.Path("a/libFan.nsp.so")), "");
  ::chmod(fDir.Path("b").c_str(), 0777);
  EXPECT_EQ(Tried(fDir.Path("a/libFan.nsp.so")).fReason, "it would run as root, but every user may write " + fDir.Path("b"));
}

TEST_F(PlugInFilesTest, AnAccessControlListLetsOthersWrite) {
  NEEDS(::geteuid() == 0, "root");
  // version 2; then the tag, the permissions and the ID of: owner rwx, user 65534 rwx, group r-x, mask rwx, others r-x
  std::string const list(
      "\x02\0\0\0"
      "\x01\0\x07\0\xff\xff\xff\xff"
      "\x02\0\x07\0\xfe\xff\0\0"
      "\x04\0\x05\0\xff\xff\xff\xff"
      "\x10\0\x07\0\xff\xff\xff\xff"
      "\x20\0\x05\0\xff\xff\xff\xff",
      44);
  std::string const file = Copy("a/libFan.nsp.so");
  ::chmod(fDir.Path("a").c_str(), 0775);
  EXPECT_EQ(RuleOf(file), "") << "its group is that of root";
  int const status = ::setxattr(fDir.Path("a").c_str(), "system.posix_acl_access", list.data(), list.size(), 0);
  NEEDS(status == 0 || errno != ENOTSUP, "a file system with access control lists");
  ASSERT_EQ(status, 0) << std::strerror(errno);
  EXPECT_EQ(Tried(file).fReason, "it would run as root, but others may write " + fDir.Path("a") + " by its access control list");
  ::chmod(fDir.Path("a").c_str(), 0755);
  EXPECT_EQ(RuleOf(file), "") << "the mask of the list does not permit writing";
}

TEST_F(PlugInFilesTest, OfSeveralTriedPlugInsWithOneNameTheFirstIsLoaded) {
  std::string const first = Copy("a/libFan.nsp.so"), second = Copy("b/libFan.nsp.so");
  std::vector<TPlugInFile> const files = FindPlugIns({{first, second, first, "/nowhere/libFan.nsp.so"}});
  EXPECT_EQ(files[0].fFile, first);
  EXPECT_TRUE(files[0].IsLoaded());
  EXPECT_EQ(files[1].fFile, second);
  EXPECT_EQ(NameOf(files[1].fRule), "replaced");
  EXPECT_EQ(files[1].fReason, "a plug-in of the same name is tried before it: " + first);
  EXPECT_TRUE(files[1].fIsMeant);
  EXPECT_EQ(NameOf(files[2].fRule), "missing") << "the file that is given twice counts once";
  EXPECT_EQ(fs::path(files[3].fFile).parent_path(), PlugInDirectory());
}

TEST_F(PlugInFilesTest, EveryFileOfTheDirectoryIsListedAfterTheTriedOnes) {
  std::string const host = Copy("libHost.nsp.so");
  std::vector<TPlugInFile> const files = FindPlugIns({{host}});
  EXPECT_EQ(files.front().fFile, host);
  std::map<std::string, std::string> rules;
  for (std::size_t at = 1; at < files.size(); ++at) rules[files[at].fFile] = NameOf(files[at].fRule);
  EXPECT_EQ(rules.at(PlugInDirectory() + "/libHost.nsp.so"), "replaced");
  EXPECT_EQ(rules.at(PlugInDirectory() + "/libzepcore.so"), "name");
  for (TPlugInFile const& file : files) EXPECT_EQ(file.fIsMeant, file.IsLoaded()) << file.fFile;
}

}  // namespace
}  // namespace NQRVZEP20
