// SPDX-License-Identifier: Apache-2.0
#include "TMemoryType.h"
#include "tests/Support.h"

namespace NQRVZEP20 {
namespace {

TEST(TMemoryTypeTest, TypesAreReadAsInSchemas) {
  struct {
    char const* fText;
    int fType;
    unsigned int fBound;
  } const rows[] = {
      {"boolean", 1, 0},
      {"uint8", 2, 0},
      {"sint8", 3, 0},
      {"uint16", 4, 0},
      {"sint16", 5, 0},
      {"uint32", 6, 0},
      {"sint32", 7, 0},
      {"uint64", 8, 0},
      {"sint64", 9, 0},
      {"real32", 10, 0},
      {"real64", 11, 0},
      {"char16", 12, 0},
      {"string", 13, 0},
      {"datetime", 14, 0},
      {"reference", 15, 0},
      {"UInt32", 6, 0},
      {"string[]", 29, 0},
      {"uint8[16]", 18, 16},
      {"String[4294967295]", 29, 4294967295u},
      {"", 0, 0},
      {"uint", 0, 0},
      {"[]", 0, 0},
      {"int[]", 0, 0},
      {"string[", 0, 0},
      {"string]", 0, 0},
      {"string[]]", 0, 0},
      {"string[x]", 0, 0},
      {"string[4x]", 0, 0},
      {"string[0]", 0, 0},
      {"string[-1]", 0, 0},
      {"string[4294967296]", 0, 0},
      {"string []", 0, 0},
      {"string[] ", 0, 0},
      {"string[ 4]", 0, 0},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fText);
    TMemoryType const type(row.fText);
    EXPECT_EQ(type.GetType(), row.fType);
    EXPECT_EQ(type.GetMaxArraySize(), row.fBound);
  }
}

TEST(TMemoryTypeTest, TypeMayBeTheLibrarysOwnTag) {
  TMemoryType const type(TCIMValue::TCIMType::kCIMTypeUint32);
  EXPECT_EQ(type.GetType(), TCIMValue::TCIMType::kCIMTypeUint32);
  EXPECT_EQ(type.GetMaxArraySize(), 0u);
}

TEST(TMemoryTypeTest, NullHasTypeAndBound) {
  TCIMValue const null = TMemoryType("uint8[16]").GetNull();
  EXPECT_TRUE(null.IsNull());
  EXPECT_EQ(null.GetType(), 18);
  EXPECT_EQ(null.GetMaxArraySize(), 16u);
  EXPECT_EQ(TMemoryType("string[]").GetNull().GetType(), 29);
}

}  // namespace
}  // namespace NQRVZEP20
