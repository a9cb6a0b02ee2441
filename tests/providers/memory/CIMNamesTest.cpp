// SPDX-License-Identifier: Apache-2.0
#include "CIMNames.h"
#include "tests/Support.h"

namespace NQRVZEP20 {
namespace {

TEST(CIMNamesTest, NameIsALetterOrUnderscoreThenLettersDigitsAndUnderscores) {
  struct {
    std::string fText;
    bool fIsName;
  } const rows[] = {
      {"X_Disk", true},       {"_", true},           {"a", true},    {"Z9", true},   {"__x__", true},
      {"\xc3\x84rger", true}, {"K\xc3\xb6ln", true}, {"", false},    {"9a", false},  {"a b", false},
      {" a", false},          {"a-b", false},        {"a.b", false}, {"a\"", false}, {std::string("a\0b", 3), false},
      {"a\x7f", false},       {"@a", false},         {"[a", false},  {"`a", false},  {"{a", false},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fText);
    EXPECT_EQ(IsCIMName(row.fText), row.fIsName);
    if (row.fIsName)
      EXPECT_NO_THROW(RequireCIMName(row.fText));
    else
      EXPECT_STATUS(RequireCIMName(row.fText), kZEPStatusInvalidCIMName);
  }
}

TEST(CIMNamesTest, NamesCompareWithoutRegardToTheCaseOfAToZ) {
  struct {
    std::string fA, fB;
    bool fIsSame;
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
    SCOPED_TRACE(row.fA + " and " + row.fB);
    EXPECT_EQ(IsSameName(row.fA, row.fB), row.fIsSame);
    EXPECT_EQ(FoldName(row.fA) == FoldName(row.fB), row.fIsSame);
    EXPECT_EQ(TNameHash()(row.fA) == TNameHash()(row.fB), row.fIsSame);
  }
  EXPECT_EQ(FoldName("X_Disk\xc3\x84"), "x_disk\xc3\x84");
}

}  // namespace
}  // namespace NQRVZEP20
