// SPDX-License-Identifier: Apache-2.0
#include "TCommUtil.h"

#include "TOSSpecific.h"
#include "tests/Support.h"

#include <atomic>
#include <clocale>
#include <thread>
#include <vector>

namespace NQRVZEP20 {
namespace {

using TParts = std::vector<std::string>;

TEST(SplitPathTest, AppendsThePiecesBetweenSeparators) {
  struct TRow {
    std::string fPath, fSeparator;
    TParts fWithout, fWith;  // keepSeparator false and true
  };
  TRow const rows[] = {
      {"", "/", {}, {}},
      {"a", "/", {"a"}, {"a"}},
      {"a/b/c", "/", {"a", "b", "c"}, {"a/", "b/", "c"}},
      {"/var/log", "/", {"", "var", "log"}, {"/", "var/", "log"}},
      {"/var/log/", "/", {"", "var", "log"}, {"/", "var/", "log/"}},
      {"/", "/", {""}, {"/"}},
      {"//", "/", {"", ""}, {"/", "/"}},
      {"a//b", "/", {"a", "", "b"}, {"a/", "/", "b"}},
      {"no separator", "/", {"no separator"}, {"no separator"}},
      // Whatever the separator's length, one character of it is kept and stepped over.
      {"a::b::", "::", {"a", ":b", ":"}, {"a:", ":b:", ":"}},
      {"a:::b", "::", {"a", "", ":b"}, {"a:", ":", ":b"}},
      {"::", "::", {"", ":"}, {":", ":"}},
      {"ab", "abc", {"ab"}, {"ab"}},
      // An empty separator is found everywhere.
      {"ab", "", {"", ""}, {"a", "b"}},
      {std::string("a\0b/c", 5), "/", {std::string("a\0b", 3), "c"}, {std::string("a\0b/", 4), "c"}},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fPath + " at " + row.fSeparator);
    TParts without, with;
    TCommUtil::SplitPath(row.fPath, without, row.fSeparator, false);
    TCommUtil::SplitPath(row.fPath, with, row.fSeparator, true);
    EXPECT_EQ(without, row.fWithout);
    EXPECT_EQ(with, row.fWith);
  }
}

TEST(SplitPathTest, KeepsThePartsThatWereThere) {
  TParts parts = {"first"};
  TCommUtil::SplitPath("a/b", parts, "/", false);
  EXPECT_EQ(parts, (TParts{"first", "a", "b"}));
  TCommUtil::SplitPath("", parts, "/", false);
  EXPECT_EQ(parts, (TParts{"first", "a", "b"}));
}

class MkDirHierTest : public testing::Test {
protected:
  TTempDir fDir;
};

TEST_F(MkDirHierTest, MakesEveryMissingDirectory) {
  TCommUtil::MkDirHier(fDir.Path("a/b/c"));
  EXPECT_TRUE(TOSSpecific::DirExists(fDir.Path("a/b/c")));
  TCommUtil::MkDirHier(fDir.Path("a/b/d/e/"));
  EXPECT_TRUE(TOSSpecific::DirExists(fDir.Path("a/b/d/e")));
  TCommUtil::MkDirHier(fDir.Path("f//g"));
  EXPECT_TRUE(TOSSpecific::DirExists(fDir.Path("f/g")));
}

TEST_F(MkDirHierTest, DoesNothingToAnExistingTree) {
  TCommUtil::MkDirHier(fDir.Path("a/b"));
  WriteFile(fDir.Path("a/b/file"), "kept");
  EXPECT_NO_THROW(TCommUtil::MkDirHier(fDir.Path("a/b")));
  EXPECT_NO_THROW(TCommUtil::MkDirHier(fDir.Path("a/b/")));
  EXPECT_NO_THROW(TCommUtil::MkDirHier("/"));
  EXPECT_NO_THROW(TCommUtil::MkDirHier(""));
  EXPECT_EQ(ReadFile(fDir.Path("a/b/file")), "kept");
}

TEST_F(MkDirHierTest, FollowsARelativePathAndLinks) {
  std::filesystem::path const old = std::filesystem::current_path();
  std::filesystem::current_path(fDir.Path());
  TCommUtil::MkDirHier("a/b/../c");
  std::filesystem::create_symlink("a", "link");
  TCommUtil::MkDirHier("link/d");
  std::filesystem::current_path(old);
  EXPECT_TRUE(TOSSpecific::DirExists(fDir.Path("a/b")));
  EXPECT_TRUE(TOSSpecific::DirExists(fDir.Path("a/c")));
  EXPECT_TRUE(TOSSpecific::DirExists(fDir.Path("a/d")));
}

TEST_F(MkDirHierTest, StopsAtAFileInTheWay) {
  WriteFile(fDir.Path("file"), "");
  EXPECT_STATUS(TCommUtil::MkDirHier(fDir.Path("file")), kZEPStatusDirectoryAlreadyExists);
  EXPECT_STATUS(TCommUtil::MkDirHier(fDir.Path("file/")), kZEPStatusDirectoryAlreadyExists);
  EXPECT_STATUS(TCommUtil::MkDirHier(fDir.Path("file/a")), kZEPStatusDirectoryAlreadyExists);
}

TEST_F(MkDirHierTest, ThreadsThatMakeOneTreeAtOnceAllFindIt) {
  constexpr int kRounds = 1200, kThreads = 4;
  std::atomic<int> failures{0}, ready{0};
  std::vector<std::thread> threads;
  for (int thread = 0; thread < kThreads; ++thread)
    threads.emplace_back([&] {
      for (int round = 1; round <= kRounds; ++round) {
        ++ready;
        while (ready < round * kThreads) std::this_thread::yield();  // all at once
        try {
          TCommUtil::MkDirHier(fDir.Path(std::to_string(round) + "/a/b/"));
        } catch (TZEPException const&) {
          ++failures;
        }
      }
    });
  for (std::thread& thread : threads) thread.join();
  EXPECT_EQ(failures, 0);
}

TEST_F(MkDirHierTest, DirectoriesMadeBeforeAFailureStay) {
  std::string const tooLong(300, 'x');
  EXPECT_STATUS(TCommUtil::MkDirHier(fDir.Path("a/b/" + tooLong + "/c")), kZEPStatusFileSystemError);
  EXPECT_TRUE(TOSSpecific::DirExists(fDir.Path("a/b")));
  EXPECT_FALSE(TOSSpecific::DirExists(fDir.Path("a/b/c")));
}

TEST(RemoveSpacesTest, CleansTheFirstLine) {
  struct TRow {
    std::string fText, fResult;
  };
  TRow const rows[] = {
      {"", ""},
      {"text", "text"},
      {"  two words  ", "two words"},
      {"    ", ""},
      {"first\nsecond", "first"},
      {"first  \nsecond", "first"},
      {"\nsecond", ""},
      {" \n second", ""},
      {"text\r\n", "text"},
      {"text \r\n", "text "},  // the blanks go before the carriage return does
      {"text\r  ", "text"},
      {"a\rb", "a"},
      {"\rtext", ""},
      {"  \r", ""},
      {"a\tb", "a\tb"},
      {"\ttext\t", "\ttext\t"},  // only the blank is a space here
      {" \t ", "\t"},
      {"a\vb\fc", "a\vb\fc"},
      {"!\"#$%&'()*+,-./:;<=>?@[\\]^_`{|}~", "!\"#$%&'()*+,-./:;<=>?@[\\]^_`{|}~"},
      {"gr\xc3\xbc\xc3\x9f"
       "e",
       ""},
      {"\xff", ""},
      {"a\x01", ""},
      {"a\x7f", ""},
      {"a\x1b[0m", ""},
      {std::string("a\0b", 3), ""},
      {"clean\n\xff", "clean"},  // the part that was cut off does not count
      {"clean\r\xff", "clean"},
  };
  for (TRow const& row : rows) EXPECT_EQ(TCommUtil::RemoveSpaces(row.fText), row.fResult) << testing::PrintToString(row.fText);
}

TEST(RemoveSpacesTest, EveryOtherByteMakesItEmpty) {
  for (int byte = 0; byte < 256; ++byte) {
    if (byte == '\n' || byte == '\r') continue;
    std::string const text = std::string("a") + static_cast<char>(byte) + "b";
    bool const isText = (byte >= 0x20 && byte < 0x7f) || byte == '\t' || byte == '\v' || byte == '\f';
    EXPECT_EQ(TCommUtil::RemoveSpaces(text), isText ? text : "") << byte;
  }
}

TEST(RemoveSpacesTest, ReadsAsciiInEveryLocale) {
  std::string const old = std::setlocale(LC_ALL, nullptr);
  NEEDS(std::setlocale(LC_ALL, "C.UTF-8") != nullptr, "another locale");
  EXPECT_EQ(TCommUtil::RemoveSpaces(" a\xa0 "), "");
  EXPECT_EQ(TCommUtil::RemoveSpaces(" a "), "a");
  std::setlocale(LC_ALL, old.c_str());
}

}  // namespace
}  // namespace NQRVZEP20
