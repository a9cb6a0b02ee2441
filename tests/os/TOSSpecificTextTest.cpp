// SPDX-License-Identifier: Apache-2.0
#include "TOSSpecific.h"

#include "tests/Support.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/mman.h>

#include <cstring>

namespace NQRVZEP20 {
namespace {

using namespace std::string_literals;
using testing::ElementsAreArray;
using testing::IsEmpty;

TEST(TOSSpecificTextTest, RemoveNonAlpaNumericReturnsTheTextInItsBrackets) {
  struct {
    char const *fText, *fExpected;
  } const rows[] = {
      {"[ABC123-1.05]", "ABC123-1.05"},
      {"-[ABC123-1.05]-", "ABC123-1.05"},
      {"ABC123-1.05", "ABC123-1.05"},
      {"", ""},
      {"before [ABC", "ABC"},
      {"ABC] after", "ABC"},
      {"[]", ""},
      {"[", ""},
      {"]", ""},
      {"a[b[c]d]e", "b[c"},  // the first of each
      {"[a]b]c", "a"},
      {"]a[b", "b"},  // the "[" goes first, and takes the "]" with it
      {"]a[b]c", "b"},
      {"(ABC) 1.05!", "(ABC) 1.05!"},  // nothing but brackets is removed
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fText);
    std::string text = row.fText;
    EXPECT_TRUE(TOSSpecific::removeNonAlpaNumeric(text));
    EXPECT_EQ(text, row.fExpected);
  }
}

TEST(TOSSpecificTextTest, BreakApartVersionSplitsAtTheSecondHyphenIfThereIsOne) {
  struct {
    char const *fText, *fHead, *fTail;
  } const rows[] = {
      {"A-B-C", "A-B", "C"},
      {"A-B", "A", "B"},
      {"A-B-C-D", "A-B", "C-D"},
      {"ABC123-1.05", "ABC123", "1.05"},
      {"AB", "AB", "AB"},
      {"", "", ""},
      {"-", "", ""},
      {"--", "-", ""},
      {"---", "-", "-"},
      {"-A", "", "A"},
      {"A-", "A", ""},
      {"A--", "A-", ""},
      {"-A-", "-A", ""},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fText);
    std::string tail = row.fText, head = row.fText;
    EXPECT_TRUE(TOSSpecific::breakApartVersion(tail, head));
    EXPECT_EQ(head, row.fHead);
    EXPECT_EQ(tail, row.fTail);
  }
}

std::vector<std::string> Split(std::string bytes, unsigned long length, char separator = '\0') {
  return TOSSpecific::multiStringTok(bytes.data(), length, separator);
}

TEST(TOSSpecificTextTest, MultiStringTokSplitsAtZeroBytes) {
  struct {
    char const* fWhat;
    std::string fBytes;
    std::vector<std::string> fExpected;
  } const rows[] = {
      {"a set with one spare byte", "first\0second\0\0\0"s, {"first", "second"}},
      {"a set without it loses its last string", "first\0second\0\0"s, {"first"}},
      {"a set of one string", "only\0\0\0"s, {"only"}},
      {"two spare bytes add the empty string", "only\0\0\0\0"s, {"only", ""}},
      {"an empty set", "\0\0\0"s, {""}},
      {"an empty string between others", "a\0\0b\0\0\0"s, {"a", "", "b"}},
      {"no zero byte at all", "text"s, {}},
      {"a last string that does not end", "a\0bcdef"s, {"a"}},
      {"every byte value", "\x01\xff\t-\0\0\0"s, {"\x01\xff\t-"}},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fWhat);
    EXPECT_THAT(Split(row.fBytes, row.fBytes.size()), ElementsAreArray(row.fExpected));
  }
}

TEST(TOSSpecificTextTest, MultiStringTokReturnsAStringThatEndsMoreThanTwoBytesBeforeTheEnd) {
  // The zero byte of "ab" has the offset 2.
  for (unsigned long length : {0ul, 1ul, 2ul, 3ul, 4ul}) {
    SCOPED_TRACE(length);
    EXPECT_THAT(Split("ab\0\0\0\0"s, length), IsEmpty());
  }
  EXPECT_THAT(Split("ab\0\0\0\0"s, 5), ElementsAreArray({"ab"}));
  EXPECT_THAT(Split("ab\0\0\0\0"s, 6), ElementsAreArray({"ab", ""}));
}

TEST(TOSSpecificTextTest, MultiStringToksSeparatorEndsTheFirstStringOnly) {
  EXPECT_THAT(Split("a;b;c\0d;e\0\0\0"s, 12, ';'), ElementsAreArray({"a", "b;c", "d;e"}));
  EXPECT_THAT(Split("a\0b;c\0\0\0"s, 8, ';'), ElementsAreArray({"a\0b"s, "c"s}));
  EXPECT_THAT(Split("abc\0\0\0"s, 6, ';'), IsEmpty());
  EXPECT_THAT(Split(";b\0\0\0"s, 5, ';'), ElementsAreArray({"", "b"}));
}

// Two pages, of which the second may not be touched.
class TGuardedPage {
public:
  TGuardedPage()
      : fPages(::mmap(nullptr, 2 * kSize, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0)),
        fIsGuarded(fPages != MAP_FAILED && ::mprotect(End(), kSize, PROT_NONE) == 0) {}
  ~TGuardedPage() { ::munmap(fPages, 2 * kSize); }
  TGuardedPage(TGuardedPage const&) = delete;
  TGuardedPage& operator=(TGuardedPage const&) = delete;

  bool IsGuarded() const { return fIsGuarded; }
  char* End() const { return static_cast<char*>(fPages) + kSize; }

private:
  static constexpr std::size_t kSize = 65536;
  void* fPages;
  bool fIsGuarded;
};

TEST(TOSSpecificTextTest, MultiStringTokReadsNothingAfterTheBuffer) {
  TGuardedPage const page;
  ASSERT_TRUE(page.IsGuarded());
  struct {
    std::string fBytes;
    std::vector<std::string> fExpected;
  } const rows[] = {
      {"", {}},     {"a", {}},   {"\0"s, {}},     {"ab", {}},    {"a\0"s, {}},
      {"\0a"s, {}}, {"abc", {}}, {"\0ab"s, {""}}, {"a\0b"s, {}}, {"a\0bcdefgh"s, {"a"}},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fBytes);
    char* const buffer = page.End() - row.fBytes.size();
    std::memcpy(buffer, row.fBytes.data(), row.fBytes.size());
    EXPECT_THAT(TOSSpecific::multiStringTok(buffer, row.fBytes.size(), '\0'), ElementsAreArray(row.fExpected));
    EXPECT_THAT(TOSSpecific::multiStringTok(buffer, row.fBytes.size(), '#'), IsEmpty());
  }
}

}  // namespace
}  // namespace NQRVZEP20
