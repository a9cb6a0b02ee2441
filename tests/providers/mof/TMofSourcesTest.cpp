// SPDX-License-Identifier: Apache-2.0
#include "tests/providers/mof/MofTexts.h"

#include <sys/types.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <filesystem>

// During its lifetime, reading any file fails with that error after so many bytes.
class TReadFault {
public:
  TReadFault(std::size_t readable, int error) {
    gReadable = readable;
    gError = error;
  }
  ~TReadFault() { gError = 0; }

  static inline std::size_t gReadable = 0;
  static inline int gError = 0;
};

// The linker replaces read by the second of these; the first is the real one.
extern "C" ssize_t __real_read(int fd, void* buffer, std::size_t size);
extern "C" ssize_t __wrap_read(int fd, void* buffer, std::size_t size) {
  if (TReadFault::gError == 0) return __real_read(fd, buffer, size);
  auto const position = static_cast<std::size_t>(::lseek(fd, 0, SEEK_CUR));
  if (position < TReadFault::gReadable) return __real_read(fd, buffer, std::min(size, TReadFault::gReadable - position));
  errno = TReadFault::gError;
  return -1;
}

namespace NQRVZEP20 {
namespace {

namespace fs = std::filesystem;

using testing::StartsWith;

class TMofSourcesTest : public testing::Test {
protected:
  TMofSourcesTest() {
    fs::create_directories(fDir.Path("schema/core"));
    fs::create_directories(fDir.Path("outside"));
    WriteFile(fDir.Path("outside/out.mof"), "class X_Out { };");
  }

  void Write(std::string const& name, std::string const& text) { WriteFile(fDir.Path("schema/" + name), text); }

  // The result of reading schema/all.mof: the classes, or the error without the directory.
  std::string Result() {
    auto const ns = NewNamespace();
    try {
      ReadMofFile(fDir.Path("schema/all.mof"), ns);
    } catch (TMofError const& error) {
      std::string message = error.what();
      EXPECT_THAT(message, StartsWith(fDir.Path("schema/")));
      return message.substr(fDir.Path("schema/").size());
    }
    std::string names;
    for (std::string const& name : ClassNames(*ns)) names += name + " ";
    return names;
  }

  TTempDir fDir;
};

TEST_F(TMofSourcesTest, AnIncludeIsReadAtItsPositionRelativeToItsFile) {
  Write("all.mof", "class X_1 { };\n#pragma include (\"core/two.mof\")\nclass X_4 { };");
  Write("core/two.mof", "class X_2 { };\n#pragma include (\"three.mof\")");
  Write("core/three.mof", "class X_3 { }; #pragma include (\"../five.mof\")");
  Write("five.mof", "class X_5 { };");
  EXPECT_EQ(Result(), "X_1 X_2 X_3 X_5 X_4 ");
}

TEST_F(TMofSourcesTest, AnErrorNamesTheIncludedFile) {
  Write("all.mof", "#pragma include (\"core/two.mof\")");
  Write("core/two.mof", "\n  class X_2 { }");
  EXPECT_EQ(Result(), "core/two.mof:2:16: expected \";\", found the end of the file");
}

TEST_F(TMofSourcesTest, IncludesStayWithinTheDirectoryOfTheFirstFile) {
  fs::create_symlink(fDir.Path("outside/out.mof"), fDir.Path("schema/link.mof"));
  fs::create_directory_symlink(fDir.Path("outside"), fDir.Path("schema/elsewhere"));
  Write("core/up.mof", "#pragma include (\"../../outside/out.mof\")");
  constexpr char kRefusal[] = "the included file is outside the directory of the first file";
  for (std::string const& name : {std::string("../outside/out.mof"), std::string("core/../../outside/out.mof"),
                                  std::string("link.mof"), std::string("elsewhere/out.mof"), fDir.Path("outside/out.mof")}) {
    SCOPED_TRACE(name);
    Write("all.mof", "#pragma include (\"" + name + "\")");
    EXPECT_EQ(Result(), std::string("all.mof:1:18: ") + kRefusal);
  }
  Write("all.mof", "#pragma include (\"core/up.mof\")");
  EXPECT_EQ(Result(), std::string("core/up.mof:1:18: ") + kRefusal);

  fs::create_directories(fDir.Path("schema2"));
  WriteFile(fDir.Path("schema2/a.mof"), "class X_A { };");  // a directory whose name begins with that of the first
  Write("all.mof", "#pragma include (\"../schema2/a.mof\")");
  EXPECT_EQ(Result(), std::string("all.mof:1:18: ") + kRefusal);

  fs::create_symlink("five.mof", fDir.Path("schema/inside.mof"));
  Write("five.mof", "class X_5 { };");
  Write("all.mof", "#pragma include (\"inside.mof\")");
  EXPECT_EQ(Result(), "X_5 ");
}

TEST_F(TMofSourcesTest, CircularIncludesAreRefused) {
  Write("all.mof", "#pragma include (\"all.mof\")");
  EXPECT_EQ(Result(), "all.mof:1:18: the file includes itself");
  Write("all.mof", "#pragma include (\"core/../b.mof\")");
  Write("b.mof", "#pragma include (\"core/../all.mof\")");
  EXPECT_EQ(Result(), "core/../b.mof:1:18: the file includes itself");
}

TEST_F(TMofSourcesTest, IncludesHaveALimitOfDepth) {
  Write("all.mof", "#pragma include (\"0.mof\")");
  for (int at = 0; at < 110; ++at) Write(std::to_string(at) + ".mof", "#pragma include (\"" + std::to_string(at + 1) + ".mof\")");
  EXPECT_EQ(Result(), "98.mof:1:18: files include one another more than 100 levels deep");
}

TEST_F(TMofSourcesTest, AnUnreadableFileHasAReason) {
  EXPECT_EQ(Result(), "all.mof: cannot be read: No such file or directory");
  Write("all.mof", "#pragma include (\"none.mof\")");
  EXPECT_EQ(Result(), "all.mof:1:18: the included file cannot be read: No such file or directory");
  Write("all.mof", "#pragma include (\"core\")");
  EXPECT_EQ(Result(), "all.mof:1:18: the included file cannot be read: Is a directory");
  EXPECT_EQ(StatusOf([&] { ReadMofFile(fDir.Path("nothing"), NewNamespace()); }), kZEPStatusFileNotFound);
  EXPECT_EQ(StatusOf([&] { ReadMofFile(fDir.Path("schema"), NewNamespace()); }), kZEPStatusFileSystemError);
}

TEST_F(TMofSourcesTest, AReadErrorInTheMiddleOfAFileIsReportedAndNothingIsDeclared) {
  std::string const text = "class X_1 { };\nclass X_2 { };\n";
  Write("all.mof", text);
  for (std::size_t const readable : {std::size_t(0), text.find('\n') + 1, text.size()}) {  // each prefix is valid MOF
    SCOPED_TRACE(readable);
    TReadFault const fault(readable, EIO);
    auto const ns = NewNamespace();
    EXPECT_EQ(StatusOf([&] { ReadMofFile(fDir.Path("schema/all.mof"), ns); }), kZEPStatusFileSystemError);
    EXPECT_THAT(ClassNames(*ns), IsEmpty());
    EXPECT_EQ(Result(), "all.mof: cannot be read: Input/output error");
  }
  EXPECT_EQ(Result(), "X_1 X_2 ");
}

TEST_F(TMofSourcesTest, AReadErrorInAnIncludedFileNamesTheDirective) {
  Write("all.mof", "#pragma include (\"a.mof\")\n");
  Write("a.mof", std::string(100, ' ') + "class X_1 { };");
  TReadFault const fault(60, EIO);
  EXPECT_EQ(Result(), "all.mof:1:18: the included file cannot be read: Input/output error");
}

// The memory of a process is a file without size, of which the first bytes cannot be read.
TEST_F(TMofSourcesTest, AFileWithoutSizeIsReadToItsEnd) {
  EXPECT_EQ(StatusOf([] { ReadMofFile("/proc/self/mem", NewNamespace()); }), kZEPStatusFileSystemError);
  EXPECT_EQ(StatusOf([] { ReadMofFile("/proc/self/status", NewNamespace()); }), kZEPStatusInvalidFormat);
  EXPECT_EQ(StatusOf([] { ReadMofFile("/proc/sys/kernel/ostype", NewNamespace()); }), kZEPStatusInvalidFormat);
}

TEST_F(TMofSourcesTest, AnEmptyFileDeclaresNothing) {
  Write("all.mof", "");
  EXPECT_EQ(Result(), "");
}

TEST_F(TMofSourcesTest, ATextCannotIncludeFiles) {
  ExpectErrors({
      {"#pragma include (\"x.mof\")", "2:18: only a file can include another file"},
  });
}

}  // namespace
}  // namespace NQRVZEP20
