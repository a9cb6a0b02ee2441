// SPDX-License-Identifier: Apache-2.0
#include "Fitting.h"
#include "TMemoryType.h"
#include "tests/Support.h"

#include <limits>

namespace NQRVZEP20 {
namespace {

TEST(FittingTest, IntegerIsConvertedToTheDeclaredTypeWhenTheNumberFits) {
  struct {
    char const* fDeclared;
    TCIMValue fGiven;
    char const* fFitted;  // its text; null when the value is returned unchanged
  } const rows[] = {
      {"uint8", TCIMValue(255), "255"},
      {"uint8", TCIMValue(256), nullptr},
      {"uint8", TCIMValue(-1), nullptr},
      {"sint8", TCIMValue(-128), "-128"},
      {"sint8", TCIMValue(128), nullptr},
      {"uint16", TCIMValue(65535u), "65535"},
      {"uint16", TCIMValue(65536u), nullptr},
      {"sint16", TCIMValue(-32768L), "-32768"},
      {"sint16", TCIMValue(32768L), nullptr},
      {"uint32", TCIMValue(4294967295ul), "4294967295"},
      {"uint32", TCIMValue(4294967296ul), nullptr},
      {"uint32", TCIMValue(-1), nullptr},
      {"sint32", TCIMValue(2147483648u), nullptr},
      {"uint64", TCIMValue(5), "5"},
      {"uint64", TCIMValue(-5), nullptr},
      {"sint64", TCIMValue(std::numeric_limits<unsigned long>::max()), nullptr},
      {"sint64", TCIMValue(static_cast<unsigned char>(7)), "7"},
      {"uint32", TCIMValue(true), nullptr},
      {"uint32", TCIMValue("5"), nullptr},
      {"uint32", TCIMValue(5.0), nullptr},
      {"real64", TCIMValue(5), nullptr},
      {"real32", TCIMValue(0.5), nullptr},
      {"string", TCIMValue(5), nullptr},
      {"boolean", TCIMValue(1), nullptr},
      {"uint32[]", TCIMValue(1), nullptr},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(std::string(row.fDeclared) + " from " + row.fGiven.ToString());
    TMemoryType const declared(row.fDeclared);
    TCIMValue const fitted = FittedTo(declared.GetNull(), row.fGiven);
    if (row.fFitted) {
      EXPECT_EQ(fitted.GetType(), declared.GetType());
      EXPECT_EQ(fitted.ToString(), row.fFitted);
    } else {
      EXPECT_EQ(fitted.GetType(), row.fGiven.GetType());
      EXPECT_EQ(fitted, row.fGiven);
    }
  }
}

TEST(FittingTest, ValueWithoutTypeBecomesANullOfTheDeclaredType) {
  for (char const* type : {"boolean", "uint8", "string", "datetime", "reference", "string[]", "uint8[16]"}) {
    SCOPED_TRACE(type);
    TCIMValue const null = TMemoryType(type).GetNull();
    TCIMValue const fitted = FittedTo(null, TCIMValue());
    EXPECT_TRUE(fitted.IsNull());
    EXPECT_EQ(fitted.GetType(), null.GetType());
    EXPECT_EQ(fitted.GetMaxArraySize(), null.GetMaxArraySize());
  }
}

TEST(FittingTest, NullOfAnotherTypeIsUnchanged) {
  EXPECT_EQ(FittedTo(TMemoryType("uint8").GetNull(), TMemoryType("uint16").GetNull()).GetType(), 4);
}

TEST(FittingTest, ArrayTakesTheDeclaredBound) {
  TCIMValue const pattern = TMemoryType("uint8[16]").GetNull();
  TCIMValue const given(TCIMValue::TCIMType::kCIMTypeUint8, 0, {TCIMValue(static_cast<unsigned char>(1))});
  TCIMValue const fitted = FittedTo(pattern, given);
  EXPECT_EQ(fitted.GetMaxArraySize(), 16u);
  EXPECT_EQ(fitted.ToString(), "{ 1 }");

  TCIMValue const fittedNull = FittedTo(pattern, TMemoryType("uint8[]").GetNull());
  EXPECT_TRUE(fittedNull.IsNull());
  EXPECT_EQ(fittedNull.GetMaxArraySize(), 16u);
}

}  // namespace
}  // namespace NQRVZEP20
