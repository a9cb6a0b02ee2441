// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/Text.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <sstream>
#include <utility>

namespace NQRVZEP20::zep {
namespace {

using testing::ElementsAre;

TEST(TextTest, WidthCountsCharacters) {
  EXPECT_EQ(WidthOf(""), 0u);
  EXPECT_EQ(WidthOf("caf\xc3\xa9"), 4u);
}

TEST(TextTest, LongTextsAreBrokenAtBlanks) {
  EXPECT_THAT(Wrapped("", 5), ElementsAre(""));
  EXPECT_THAT(Wrapped("12345", 5), ElementsAre("12345"));
  EXPECT_THAT(Wrapped("12345 789", 5), ElementsAre("12345", "789"));
  EXPECT_THAT(Wrapped("one two three", 7), ElementsAre("one two", "three"));
  EXPECT_THAT(Wrapped("one two three", 6), ElementsAre("one", "two", "three"));
  EXPECT_THAT(Wrapped("1234567890", 4), ElementsAre("1234", "5678", "90"));
  EXPECT_THAT(Wrapped("a 1234567890", 4), ElementsAre("a", "1234", "5678", "90"));
  EXPECT_THAT(Wrapped("   ", 1), ElementsAre(""));
  EXPECT_THAT(Wrapped("a    b", 2), ElementsAre("a", "b"));
  EXPECT_THAT(Wrapped("ends in blanks   ", 14), ElementsAre("ends in blanks"));
  EXPECT_THAT(Wrapped("\xc3\xa9\xc3\xa9\xc3\xa9", 2), ElementsAre("\xc3\xa9\xc3\xa9", "\xc3\xa9"));
}

TEST(TextTest, ATableKeepsItsColumns) {
  TTable table({6, 8, 4});
  table.Add({"Name", "Value", "By"});
  table.Add({"a", "one two three", "x"});
  table.Add({"long name", "v", "y"});
  table.Add({"b", "", "z"});
  EXPECT_EQ(table.GetText(),
            "Name    Value     By\n"
            "a       one two   x\n"
            "        three\n"
            "long    v         y\n"
            "name\n"
            "b                 z\n");
}

TEST(TextTest, AColumnIsAsWideAsItsLongestWord) {
  TTable table({6, 8, 62});
  table.Add({"Name", "Value", "By"});
  table.Add({"ConfiguredMemoryClockSpeed", "v", "x"});
  std::string const blanks(22, ' ');
  EXPECT_EQ(table.GetText(), "Name" + blanks + "  Value     By\nConfiguredMemoryClockSpeed  v         x\n");
}

TEST(TextTest, ColumnsGiveUpUnneededWidth) {
  TTable table({4, 20});
  table.Add({"1234567890", "one two three four"});
  EXPECT_EQ(table.TextFor(ELayout::kFile, 26), "1234567890  one two three\n            four\n");
  EXPECT_EQ(table.TextFor(ELayout::kFile, 20), "1234567890  one two\n            three\n            four\n");
}

TEST(TextTest, AWordThatFillsMostOfTheLineIsBroken) {
  TTable table({4, 10, 4});
  table.Add({"a", "12345678901234567890", "b"});
  table.Add({"c", "1234567890 12345", "d"});
  EXPECT_EQ(table.TextFor(ELayout::kFile, 24),
            "a     1234567890  b\n"
            "      1234567890\n"
            "c     1234567890  d\n"
            "      12345\n");
}

TEST(TextTest, AQuantityStaysOnOneLine) {
  TTable table({10, 4, 4}, ENarrowTable::kBreaksWords);
  table.Add({"Name", "Size", "Free"});
  table.Add({"/mnt/a/name", "11.8 GiB", "4 KiB"});
  EXPECT_EQ(table.TextFor(ELayout::kFile, 80), "Name         Size      Free\n/mnt/a/name  11.8 GiB  4 KiB\n");
  EXPECT_EQ(table.TextFor(ELayout::kFile, 24), "Name     Size      Free\n/mnt/a/  11.8 GiB  4 KiB\nname\n");
}

// The names of file systems are those of other people: long words, escapes, and texts of many characters.
TEST(TextTest, HostileNamesBreakNeitherQuantitiesNorLines) {
  std::vector<std::string> const names = {
      std::string(300, 'x'),
      "/mnt/sandboxing/model_tools_env/v1/python",
      std::string(40, '\x1b'),
      std::string(500, ' '),
      "1 2 3 4 5 6 7 8 9 10 11 12 13 14 15 16 17 18 19 20 21 22 23 24 25 26 27 28 29 30 31 32 33 34 35 36 37 38 39 40",
      "1 " + std::string(200, 'x'),
      "<script>" + std::string(60, '\xff')};
  TTable table({40, 8, 8, 7, 9}, ENarrowTable::kBreaksWords);
  table.Add({"File system", "Type", "Size", "Free", "Read-only"});
  for (std::string const& name : names) table.Add({name, "squashfs", "1023.9 GiB", "11.8 GiB", "false"});

  for (auto const& [layout, width] : {std::pair{ELayout::kTerminal, 60u}, std::pair{ELayout::kTerminal, 80u},
                                      std::pair{ELayout::kTerminal, 120u}, std::pair{ELayout::kFile, 80u}}) {
    std::istringstream lines(table.TextFor(layout, width));
    std::size_t quantities = 0;
    for (std::string line; std::getline(lines, line);) {
      EXPECT_LE(WidthOf(line), width) << line;
      if (line.find("1023.9 GiB  11.8 GiB  false") != line.npos) ++quantities;
    }
    EXPECT_EQ(quantities, names.size()) << "in a width of " << width;
  }
}

TEST(TextTest, WideColumnsFillTheTerminal) {
  TTable table({6, 8});
  table.Add({"one two", "three four five six"});
  EXPECT_EQ(table.TextFor(ELayout::kFile, 80), "one     three\ntwo     four\n        five six\n");
  EXPECT_EQ(table.TextFor(ELayout::kTerminal, 22), "one     three four\ntwo     five six\n");
  EXPECT_EQ(table.TextFor(ELayout::kTerminal, 80), "one two  three four five six\n");
}

TEST(TextTest, OnADumbTerminalARowIsOneLine) {
  TTable table({6, 8});
  table.Add({"one two", "three four five six"});
  table.Add({"a", "b"});
  EXPECT_EQ(table.TextFor(ELayout::kPlain, 20), "one two  three four five six\na        b\n");
}

TEST(TextTest, CellsAreMadePrintable) {
  TTable table({20});
  table.Add({"\x1b[2J\n"});
  EXPECT_EQ(table.GetText(), "\\x1b[2J\\x0a\n");
}

TEST(TextTest, SizesAreRoundedOrExact) {
  struct TRow {
    std::uint64_t fBytes;
    char const *fRounded, *fExact;
  } const rows[] = {
      {0, "0 B", "0 bytes"},
      {1023, "1023 B", "1023 bytes"},
      {1024, "1 KiB", "1 KiB"},
      {1025, "1 KiB", "1025 bytes"},
      {1536, "1.5 KiB", "1536 bytes"},
      {400000, "390.6 KiB", "400000 bytes"},
      {1048524, "1023.9 KiB", "1048524 bytes"},
      {1048525, "1 MiB", "1048525 bytes"},
      {1048575, "1 MiB", "1048575 bytes"},
      {7864320, "7.5 MiB", "7680 KiB"},
      {8535000000, "7.9 GiB", "8535000000 bytes"},
      {2199023255552, "2 TiB", "2 TiB"},
      {1152921504606846976, "1048576 TiB", "1048576 TiB"},
  };
  for (TRow const& row : rows) {
    EXPECT_EQ(SizeText(row.fBytes), row.fRounded) << row.fBytes;
    EXPECT_EQ(ExactSizeText(row.fBytes), row.fExact) << row.fBytes;
  }
}

}  // namespace
}  // namespace NQRVZEP20::zep
