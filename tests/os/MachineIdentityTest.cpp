// SPDX-License-Identifier: Apache-2.0
#include "os/MachineIdentity.h"

#include "os/MachineTypeTable.h"
#include "tests/SmbiosTables.h"

#include <gtest/gtest.h>

#include <cctype>
#include <set>

namespace NQRVZEP20 {
namespace {

TEST(MachineIdentityTest, AProductDescriptionIsCutAtItsFirstDash) {
  struct TRow {
    char const* fDescription;
    char const* fType;
    char const* fName;
    char const* fModel;
  };
  TRow const rows[] = {
      {"Server Q100 -[1234AB7]-", "1234", "Server Q100 ", "AB7"},
      {"Server-[5678XY1]-", "5678", "Server", "XY1"},
      {"-[1234AB7]-", "1234", "", "AB7"},
      {"Rack-Server Q200 -[5678XY1]-", "erve", "Rack", "r Q"},  // the first "-", wherever it is
      {"A--[1234AB7]-", "[123", "A", "4AB"},
      {"Server -[1234]-", "1234", "Server ", "Unknown"},  // "]-" is not a model
      {"Server -[1234", "1234", "Server ", "Unknown"},
      {"Server -[1234AB", "1234", "Server ", "Unknown"},
      {"Server -[1234AB7", "1234", "Server ", "AB7"},
      // Without a "-", a bare type and model of exactly 7 characters.
      {"1234AB7", "1234", "Unknown", "Unknown"},
      {"1234AB78", "0000", "Unknown", "Unknown"},
      {"1234AB", "0000", "Unknown", "Unknown"},
      {"", "0000", "Unknown", "Unknown"},
      {"Standard PC (i440FX + PIIX, 1996)", "0000", "Unknown", "Unknown"},
      // 7 characters with a "-" are cut all the same.
      {"123-AB7", "0000", "123", "Unknown"},
      // An incomplete type or model is not returned.
      {"-", "0000", "", "Unknown"},
      {"A-", "0000", "A", "Unknown"},
      {"A-[", "0000", "A", "Unknown"},
      {"Name-[12", "0000", "Name", "Unknown"},
      {"Name-[123", "0000", "Name", "Unknown"},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fDescription);
    TMachineIdentity identity;
    ReadProductDescription(row.fDescription, identity);
    EXPECT_EQ(identity.fType, row.fType);
    EXPECT_EQ(identity.fName, row.fName);
    EXPECT_EQ(identity.fModel, row.fModel);
    EXPECT_EQ(identity.fSerialNumber, "Unknown");
  }
}

TEST(MachineIdentityTest, EveryLengthOfADescriptionIsReadWithoutAnException) {
  std::string const whole = "Server Q100 -[1234AB7]-";
  for (std::size_t from = 0; from <= whole.size(); ++from)
    for (std::size_t size = 0; size <= whole.size() - from; ++size) {
      TMachineIdentity identity;
      ReadProductDescription(whole.substr(from, size), identity);
      EXPECT_EQ(identity.fType.size(), 4u) << whole.substr(from, size);
    }
}

std::string StringNamedAt(std::string const& structure, std::size_t offset) {
  return std::string(TStructureStrings(structure).NamedAt(offset).value_or("none"));
}

TEST(MachineIdentityTest, StringsOfAStructureAreFoundByTheirNumber) {
  std::string const structure = Structure(1, "\0\1\2\3\0\4\xFF"s, {"one", "two", "three"});
  struct TRow {
    std::size_t fOffset;
    char const* fText;
  };
  TRow const rows[] = {
      {5, "one"},     {6, "two"},  {7, "three"}, {4, "none"},
      {8, "none"},    {9, "none"}, {10, "none"}, {11, "none"},  // after the formatted area
      {1000, "none"},
  };
  for (TRow const& row : rows) EXPECT_EQ(StringNamedAt(structure, row.fOffset), row.fText) << row.fOffset;
}

TEST(MachineIdentityTest, TheLastStringSurvives) {
  EXPECT_EQ(StringNamedAt(Structure(1, "\0\1"s, {"only"}), 5), "only");
  EXPECT_EQ(StringNamedAt(Structure(1, "\0\2"s, {"one", "x"}), 5), "x");
}

TEST(MachineIdentityTest, DamagedStructuresNameNoString) {
  struct TRow {
    char const* fWhat;
    std::string fStructure;
    char const* fText;
  };
  TRow const rows[] = {
      {"empty", "", "none"},
      {"one byte", "\1", "none"},
      {"two bytes", "\1\6", "none"},
      {"formatted length 0", "\1\0\0\0\0\1one\0\0"s, "none"},
      {"formatted length past the end", "\1\xFF\0\0\0\1one\0\0"s, "none"},
      {"a formatted area that ends before the byte", "\1\5\0\0\0\1one\0\0"s, "none"},
      {"no string set", "\1\6\0\0\0\1"s, "none"},
      {"a string without an end", "\1\6\0\0\0\1one"s, "none"},
      {"a string and one zero", "\1\6\0\0\0\1one\0"s, "none"},
      {"an empty set", "\1\6\0\0\0\1\0\0"s, "none"},
      {"an empty set, followed by zeros", "\1\6\0\0\0\2\0\0\0\0"s, "none"},
      {"a number after the set, followed by zeros", "\1\6\0\0\0\2one\0\0\0"s, "none"},
      {"a number after the set, followed by more zeros", "\1\6\0\0\0\3one\0\0\0\0\0\0"s, "none"},
      {"a number after the set, followed by another text", "\1\6\0\0\0\3one\0\0two\0\0"s, "none"},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fWhat);
    EXPECT_EQ(StringNamedAt(row.fStructure, 5), row.fText);
  }
}

TEST(MachineIdentityTest, ABiosVersionIsCleanedUpToItsBuild) {
  struct TRow {
    char const* fVersion;
    char const* fCleaned;
  };
  TRow const rows[] = {
      {"-[ABE123CUS-1.10]-", "ABE123CUS"},
      {"ABE123C", "ABE123C"},
      {"ABE123C-1.10", "ABE123C"},
      {"-[A-B-C]-", "A-B"},  // at the second hyphen where there is one
      {"-[7]-", "7"},
      {"7", "7"},
      {"-", "-"},  // a single character is not split
      {"-1.10", ""},
      {"[]", ""},
      {"", ""},
  };
  for (TRow const& row : rows) EXPECT_EQ(CleanBiosVersion(row.fVersion), row.fCleaned) << row.fVersion;
}

TEST(MachineIdentityTest, TheTableHas17DistinctRows) {
  std::set<std::string_view> prefixes, types;
  for (TMachineTypeRow const& row : kMachineTypeTable) {
    EXPECT_EQ(row.fBuildPrefix.size(), 2u);
    for (char c : row.fBuildPrefix) EXPECT_TRUE(std::islower(static_cast<unsigned char>(c))) << row.fBuildPrefix;
    EXPECT_EQ(row.fMachineType.size(), 4u);
    for (char c : row.fMachineType) EXPECT_TRUE(std::isdigit(static_cast<unsigned char>(c))) << row.fMachineType;
    prefixes.insert(row.fBuildPrefix);
    types.insert(row.fMachineType);
  }
  EXPECT_EQ(prefixes.size(), 17u);
  EXPECT_EQ(types.size(), 17u);
}

TEST(MachineIdentityTest, TheTypeOfABuildIsThatOfTheFirstRowThatMatches) {
  for (TMachineTypeRow const& row : kMachineTypeTable)
    EXPECT_EQ(MachineTypeOfBuild(std::string(row.fBuildPrefix) + "e118b"), std::string(row.fMachineType)) << row.fBuildPrefix;
  struct TRow {
    char const* fBuildNumber;
    char const* fType;
  };
  TRow const rows[] = {
      {"qae118b", "1234"}, {"118bqa", "1234"},                       // anywhere in the string
      {"qxqa", "1234"},                                              // two prefixes: the earlier row, not the earlier place
      {"qsqv", "5678"},    {"qvqs", "5678"},   {"QAE118B", "none"},  // the build number is given in lower case
      {"q", "none"},       {"q a", "none"},    {"abe123cus", "none"}, {"", "none"},
  };
  for (TRow const& row : rows) EXPECT_EQ(MachineTypeOfBuild(row.fBuildNumber).value_or("none"), row.fType) << row.fBuildNumber;
}

}  // namespace
}  // namespace NQRVZEP20
