// SPDX-License-Identifier: Apache-2.0
#include "CIMNames.h"
#include "tests/Support.h"

namespace NQRVZEP20 {
namespace {

TEST(CIMNamesTest, NameIsALetterOrUnderscoreThenLettersDigitsAndUnderscores) {
  struct {
    std::string text;
    bool isName;
  } const rows[] = {
      {"X_Disk", true},       {"_", true},           {"a", true},    {"Z9", true},   {"__x__", true},
      {"\xc3\x84rger", true}, {"K\xc3\xb6ln", true}, {"", false},    {"9a", false},  {"a b", false},
      {" a", false},          {"a-b", false},        {"a.b", false}, {"a\"", false}, {std::string("a\0b", 3), false},
      {"a\x7f", false},       {"@a", false},         {"[a", false},  {"`a", false},  {"{a", false},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.text);
    EXPECT_EQ(IsCIMName(row.text), row.isName);
    if (row.isName)
      EXPECT_NO_THROW(RequireCIMName(row.text));
    else
      EXPECT_STATUS(RequireCIMName(row.text), kZEPStatusInvalidCIMName);
  }
}

TEST(CIMNamesTest, NamesCompareWithoutRegardToTheCaseOfAToZ) {
  struct {
    std::string a, b;
    bool isSame;
  } const rows[] = {
      {"X_Disk", "x_dISK", true},
      {"", "", true},
      {"a", "ab", false},
      {"ab", "a", false},
      {"a", "b", false},
      {"[", "{", false},
      {"@", "`", false},
      {"\xc3\x84", "\xc3\xa4", false},
      {"AZ", "az", true},
      {"a_1", "A_1", true},
      {"\xc3\x84", "\xc3\x84", true},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.a + " and " + row.b);
    EXPECT_EQ(IsSameName(row.a, row.b), row.isSame);
    EXPECT_EQ(FoldName(row.a) == FoldName(row.b), row.isSame);
    EXPECT_EQ(TNameHash()(row.a) == TNameHash()(row.b), row.isSame);
  }
  EXPECT_EQ(FoldName("X_Disk\xc3\x84"), "x_disk\xc3\x84");
}

}  // namespace
}  // namespace NQRVZEP20
