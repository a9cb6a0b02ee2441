// SPDX-License-Identifier: Apache-2.0
#include "TCommUtil.h"
#include "tests/Support.h"

#include <clocale>

namespace NQRVZEP20 {
namespace {

TEST(RemoveSpacesTest, CleansTheFirstLine) {
  struct TRow {
    std::string text, result;
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
      {"clean\n\xff", "clean"},  // what was cut off does not count
      {"clean\r\xff", "clean"},
  };
  for (TRow const& row : rows) EXPECT_EQ(TCommUtil::RemoveSpaces(row.text), row.result) << testing::PrintToString(row.text);
}

TEST(RemoveSpacesTest, EveryOtherByteMakesItEmpty) {
  for (int byte = 0; byte < 256; ++byte) {
    if (byte == '\n' || byte == '\r') continue;
    std::string const text = std::string("a") + static_cast<char>(byte) + "b";
    bool const isText = (byte >= 0x20 && byte < 0x7f) || byte == '\t' || byte == '\v' || byte == '\f';
    EXPECT_EQ(TCommUtil::RemoveSpaces(text), isText ? text : "") << byte;
  }
}

TEST(RemoveSpacesTest, ReadsAsciiWhateverTheLocale) {
  std::string const old = std::setlocale(LC_ALL, nullptr);
  NEEDS(std::setlocale(LC_ALL, "C.UTF-8") != nullptr, "another locale");
  EXPECT_EQ(TCommUtil::RemoveSpaces(" a\xa0 "), "");
  EXPECT_EQ(TCommUtil::RemoveSpaces(" a "), "a");
  std::setlocale(LC_ALL, old.c_str());
}

}  // namespace
}  // namespace NQRVZEP20
