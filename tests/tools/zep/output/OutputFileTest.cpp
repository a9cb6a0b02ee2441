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

TEST(OutputFileTest, WritesAndReplacesAFileWithTheUsualMode) {
  TTempDir const dir;
  WriteOutputFile(dir.Path("a"), "one");
  WriteOutputFile(dir.Path("a"), "two");
  EXPECT_EQ(ReadFile(dir.Path("a")), "two");
  EXPECT_EQ(FilesIn(dir.Path()), 1u);
  mode_t const mask = ::umask(0);
  ::umask(mask);
  EXPECT_EQ(static_cast<mode_t>(fs::status(dir.Path("a")).permissions()), 0666 & ~mask);
}

TEST(OutputFileTest, ADeviceALinkAndADirectoryAreNotReplaced) {
  TTempDir const dir;
  fs::create_directory(dir.Path("d"));
  fs::create_symlink("/nowhere", dir.Path("link"));
  for (std::string const& name : {dir.Path("d"), dir.Path("link"), std::string("/dev/null")})
    EXPECT_EQ(WhyRefused(name), name + " cannot be written: it is not a regular file");
  EXPECT_EQ(FilesIn(dir.Path()), 2u);
  EXPECT_EQ(WhyRefused("/nowhere/a"), "/nowhere/a cannot be written: No such file or directory");
}

}  // namespace
}  // namespace NQRVZEP20::zep
