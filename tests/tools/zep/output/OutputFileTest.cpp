// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/OutputFile.h"

#include "tests/Support.h"
#include "tools/zep/output/Failure.h"

#include <gmock/gmock.h>
#include <sys/stat.h>

namespace NQRVZEP20::zep {
namespace {

namespace fs = std::filesystem;

std::size_t FilesIn(std::string const& directory) {
  return static_cast<std::size_t>(std::distance(fs::directory_iterator(directory), fs::directory_iterator()));
}

std::string WhyRefused(std::string const& file) {
  try {
    WriteOutputFile(file, "new");
  } catch (TFailure const& failure) {
    EXPECT_EQ(failure.fStatus, kExitNotWritten);
    return failure.what();
  }
  return "";
}

TEST(OutputFileTest, WritesAFileWithTheUsualModeAndReplacesItWithItsOwn) {
  TTempDir const dir;
  mode_t const before = ::umask(026);
  WriteOutputFile(dir.Path("a"), "one");
  ::umask(before);
  EXPECT_EQ(static_cast<mode_t>(fs::status(dir.Path("a")).permissions()), 0640u);
  fs::permissions(dir.Path("a"), fs::perms::owner_read | fs::perms::owner_write);
  WriteOutputFile(dir.Path("a"), "two");
  EXPECT_EQ(ReadFile(dir.Path("a")), "two");
  EXPECT_EQ(static_cast<mode_t>(fs::status(dir.Path("a")).permissions()), 0600u);
  EXPECT_EQ(FilesIn(dir.Path()), 1u);
}

TEST(OutputFileTest, APrivateFileIsOfItsOwnerAlsoIfItReplacesAnother) {
  TTempDir const dir;
  WriteFile(dir.Path("a"), "one");
  fs::permissions(dir.Path("a"), fs::perms::all);
  WritePrivateFile(dir.Path("a"), "two");
  EXPECT_EQ(ReadFile(dir.Path("a")), "two");
  EXPECT_EQ(static_cast<mode_t>(fs::status(dir.Path("a")).permissions()), 0600u);
}

TEST(OutputFileTest, APipeALinkAndADirectoryAreNotReplaced) {
  TTempDir const dir;
  fs::create_directory(dir.Path("d"));
  fs::create_symlink("/nowhere", dir.Path("link"));
  ASSERT_EQ(::mkfifo(dir.Path("pipe").c_str(), 0600), 0);
  for (std::string const& name : {dir.Path("d"), dir.Path("link"), dir.Path("pipe")})
    EXPECT_EQ(WhyRefused(name), name + " cannot be written: it is not a regular file");
  EXPECT_EQ(FilesIn(dir.Path()), 3u);
  EXPECT_EQ(WhyRefused("/nowhere/a"), "/nowhere/a cannot be written: No such file or directory");
}

}  // namespace
}  // namespace NQRVZEP20::zep
