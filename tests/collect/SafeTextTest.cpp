// SPDX-License-Identifier: Apache-2.0
#include "collect/SafeText.h"

#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

TEST(SafeTextTest, CharactersThatControlATerminalAreEscaped) {
  struct TRow {
    std::string fText, fPrintable;
  } const rows[] = {
      {"plain text, 100 %", "plain text, 100 %"},
      {"", ""},
      {"\x1b[31mred", "\\x1b[31mred"},
      {"a\nb\tc\rd", "a\\x0ab\\x09c\\x0dd"},
      {std::string("a\0b", 3), "a\\x00b"},
      {"\x7f", "\\x7f"},
      {"caf\xc3\xa9 \xe2\x82\xac \xf0\x9f\x98\x80", "caf\xc3\xa9 \xe2\x82\xac \xf0\x9f\x98\x80"},
      {"\xc2\x9b"
       "31m",
       "\\x9b"
       "31m"},  // a control character of two bytes
      {"\xe2\x80\xae"
       "abc",
       "\\u202e"
       "abc"},  // writes from right to left
      {"a\xe2\x80\x8b"
       "b",
       "a\\u200b"
       "b"},  // has no width
      {"\xef\xbb\xbf", "\\ufeff"},
      {"\xef\xbf\xbe\xef\xb7\x90", "\\ufffe\\ufdd0"},  // not characters
      {"\xf0\x9f\xbf\xbf", "\\u1ffff"},
      {"\xff\xfe", "\\xff\\xfe"},
      {"\xc3", "\\xc3"},  // cut
      {"\xc3(", "\\xc3("},
      {"\xc0\xaf", "\\xc0\\xaf"},  // longer than need be
      {"\xe0\x80\xaf", "\\xe0\\x80\\xaf"},
      {"\xed\xa0\x80", "\\xed\\xa0\\x80"},           // half of a pair
      {"\xf4\x90\x80\x80", "\\xf4\\x90\\x80\\x80"},  // beyond the last character
      {"\x80", "\\x80"},
  };
  for (TRow const& row : rows) EXPECT_EQ(Printable(row.fText), row.fPrintable) << testing::PrintToString(row.fText);
}

TEST(SafeTextTest, OnlyZeroBytesAndBytesThatAreNotUtf8AreEscaped) {
  EXPECT_EQ(WithBytesEscaped("caf\xc3\xa9 \x1b\n\xc2\x9b\xe2\x80\xae"), "caf\xc3\xa9 \x1b\n\xc2\x9b\xe2\x80\xae");
  EXPECT_EQ(WithBytesEscaped(std::string("a\0b\xff\xc3", 5)), "a\\x00b\\xff\\xc3");
}

TEST(SafeTextTest, EveryByteBecomesPrintable) {
  for (int byte = 0; byte < 256; ++byte) {
    std::string const text = Printable(std::string(1, static_cast<char>(byte)));
    for (char c : text) EXPECT_TRUE(c >= 0x20 && c < 0x7f) << byte;
  }
}

TEST(SafeTextTest, TheFirstCharacterHasItsCodeAndSize) {
  EXPECT_EQ(FirstCharacterOf("a\xc3\xa9").fSize, 1u);
  EXPECT_EQ(FirstCharacterOf("\xc3\xa9"
                             "a")
                .fSize,
            2u);
  EXPECT_EQ(FirstCharacterOf("\xc3\xa9"
                             "a")
                .fCode,
            0xe9u);
  EXPECT_EQ(FirstCharacterOf("\xf0\x9f\x98\x80").fCode, 0x1f600u);
  EXPECT_EQ(FirstCharacterOf("\xff"
                             "a")
                .fSize,
            0u);
}

TEST(SafeTextTest, ALongTextIsShortenedBetweenCharacters) {
  struct TRow {
    std::string fText, fShortened;  // to 10 bytes
  } const rows[] = {
      {"", ""},
      {"ten bytes.", "ten bytes."},
      {"eleven byte", "eleven ..."},
      {"sixsix\xc3\xa9 and more", "sixsix..."},
      {"fivef\xe2\x82\xac and more", "fivef..."},
      {"four\xf0\x9f\x98\x80 and more", "four..."},
      {"seven77\xc3\xa9 and more", "seven77..."},
      {std::string(11, '\x80'), std::string(7, '\x80') + "..."},  // not UTF-8
  };
  for (TRow const& row : rows) EXPECT_EQ(Shortened(row.fText, 10), row.fShortened) << row.fText;
}

}  // namespace
}  // namespace NQRVZEP20
