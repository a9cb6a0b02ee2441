// SPDX-License-Identifier: Apache-2.0
#include "providers/mof/MofStrings.h"

#include "tests/providers/mof/MofTexts.h"

namespace NQRVZEP20 {
namespace {

TEST(MofStringsTest, CharactersAreReadAsTheirCode) {
  for (auto const& [literal, code] :
       {std::pair("'A'", "65"), std::pair("'\\x41'", "65"), std::pair("'\\xFFFF'", "65535"), std::pair("'\\x0'", "0"),
        std::pair("'\\n'", "10"), std::pair("'\\''", "39"), std::pair("'\"'", "34"), std::pair("'\xc3\xa9'", "233"),
        std::pair("'\xe2\x82\xac'", "8364"), std::pair("67", "67")})
    EXPECT_EQ(DefaultOf(std::string("char16 P = ") + literal + ";").ToString(), code) << literal;
}

TEST(MofStringsTest, EscapesOfStringsAreResolved) {
  for (auto const& [literal, text] :
       {std::pair(R"("\b\t\n\f\r")", "\b\t\n\f\r"), std::pair(R"("\"\'\\")", "\"'\\"),
        std::pair(R"("\x41\X42\x043C")", "AB\xd0\xbc"), std::pair(R"("\xe9t\xE9")", "\xc3\xa9t\xc3\xa9"),
        std::pair(R"("\x20AC")", "\xe2\x82\xac"), std::pair("\"\xc3\xa9\"", "\xc3\xa9"),
        std::pair("\"// no comment /* */\"", "// no comment /* */"),
        std::pair("\"a\" // joined\n  \"b\" /* too */ \"c\"", "abc")})
    EXPECT_EQ(DefaultOf(std::string("string P = ") + literal + ";").ToString(), text) << literal;
  EXPECT_EQ(DefaultOf("string P = \"a\\x0\";").ToString(), std::string("a\0", 2));
}

TEST(MofStringsTest, AMalformedLiteralIsRefused) {
  ExpectErrors({
      {"class X_A { string P = \"a\\q\"; };", "2:26: unknown escape sequence"},
      {"class X_A { string P = \"\\xg\"; };", "2:25: expected one to four hexadecimal digits after \"\\x\""},
      {"class X_A { string P = \"\\xD800\"; };", "2:25: half of a surrogate pair is not a character"},
      {"class X_A { char16 P = 'ab'; };", "2:24: expected one character of 16 bits between the quotes"},
      {"class X_A { char16 P = ''; };", "2:24: expected one character of 16 bits between the quotes"},
      {"class X_A { char16 P = '\xf0\x9f\x98\x80'; };", "2:24: expected one character of 16 bits between the quotes"},
  });
}

TEST(MofStringsTest, TextIsEscapedForBetweenQuotes) {
  EXPECT_EQ(Escaped("a'b\"c\\d"), R"(a'b\"c\\d)");
  EXPECT_EQ(Escaped("\b\t\n\f\r"), R"(\b\t\n\f\r)");
  EXPECT_EQ(Escaped(std::string("\0\x1f\x7f\xc3\xa9", 5)), "\\x0000\\x001F\\x007F\xc3\xa9");
}

TEST(MofStringsTest, ACharacterIsEscapedUnlessItIsPrintableAscii) {
  for (auto const& [code, text] : {std::pair(0x41, "'A'"), std::pair(0x22, "'\"'"), std::pair(0x27, "'\\x0027'"),
                                   std::pair(0x5c, "'\\x005C'"), std::pair(0, "'\\x0000'"), std::pair(0xffff, "'\\xFFFF'")})
    EXPECT_EQ(EscapedCharacter(static_cast<unsigned short>(code)), text);
}

}  // namespace
}  // namespace NQRVZEP20
