// SPDX-License-Identifier: Apache-2.0
#include "TStoredValue.h"

#include "Collect.h"

#include <cmath>
#include <cstring>

namespace NQRVZEP20 {
namespace {

TEST(TStoredValueTest, EveryKindOfValueIsReturnedUnchanged) {
  TType::ECIMType const kStrings = TType::ECIMType(TType::kCIMTypeString | TType::kCIMTypeArrayFlag);
  for (TCIMValue const& value :
       {TCIMValue(), NullOf("string"), NullOf("uint8[16]"), NullOf("boolean"), NullOf("reference"), TCIMValue(kStrings, 4),
        TCIMValue(true), TCIMValue(false), TCIMValue(""), TCIMValue(std::string("a\0b", 3)), TCIMValue(std::string(5000, 'x')),
        TCIMValue(7u), TCIMValue(-1.5), TCIMValue(TType::kCIMTypeString, 3, {TCIMValue("Other"), TCIMValue("")}),
        TCIMValue(TType::kCIMTypeString, 0, {}), TCIMValue(TType::kCIMTypeUint32, 0, {TCIMValue(7u)})}) {
    SCOPED_TRACE(static_cast<int>(value.GetType()));
    TCIMValue const again = TStoredValue(value).Get();
    EXPECT_EQ(again.GetType(), value.GetType());
    EXPECT_EQ(again.GetMaxArraySize(), value.GetMaxArraySize());
    EXPECT_EQ(again.IsNull(), value.IsNull());
    EXPECT_EQ(value.IsNull() ? "" : again.ToString(), value.IsNull() ? "" : value.ToString());
  }
}

TEST(TStoredValueTest, NumbersKeepTheirTypeAndLastDigit) {
  for (TCIMValue const& number : {TCIMValue(static_cast<unsigned char>(255)), TCIMValue(static_cast<signed char>(-128)),
                                  TCIMValue(static_cast<unsigned short>(65535)), TCIMValue(static_cast<short>(-32768)),
                                  TCIMValue(4294967295u), TCIMValue(-2147483647 - 1), TCIMValue(18446744073709551615ul),
                                  TCIMValue(-9223372036854775807l - 1), TCIMValue(0.1f), TCIMValue(0.1), TCIMValue(5e-324)}) {
    SCOPED_TRACE(number.GetType().ToString());
    EXPECT_EQ(TStoredValue(number).Get(), number);
    TCIMValue const array(number.GetType(), 2, {number, number});
    EXPECT_EQ(TStoredValue(array).Get(), array);
    EXPECT_EQ(TStoredValue(array).Get().GetMaxArraySize(), 2u);
  }
}

TEST(TStoredValueTest, TheSignOfZeroAndTheBitsOfNotANumberAreKept) {
  double const again = TStoredValue(TCIMValue(-0.0)).Get();
  EXPECT_TRUE(std::signbit(again));
  double const notANumber = std::nan("12345");
  double const stored = TStoredValue(TCIMValue(notANumber)).Get();
  EXPECT_EQ(std::memcmp(&stored, &notANumber, sizeof stored), 0);
}

TEST(TStoredValueTest, ElementsThatAreNullOrOfAnotherTypeAreKept) {
  TCIMValue withNull(TType::kCIMTypeUint32, 0, {TCIMValue(7u), TCIMValue(8u)});
  withNull.operator std::vector<TCIMValue>&()[0] = NullOf("uint32");
  TCIMValue const again = TStoredValue(withNull).Get();
  EXPECT_TRUE(again.operator std::vector<TCIMValue>&()[0].IsNull());
  EXPECT_EQ(again.operator std::vector<TCIMValue>&()[1], TCIMValue(8u));

  TCIMValue mixed(TType::kCIMTypeUint32, 0, {TCIMValue(7u), TCIMValue(8u)});
  mixed.operator std::vector<TCIMValue>&()[1] = TCIMValue("text");
  EXPECT_EQ(TStoredValue(mixed).Get().operator std::vector<TCIMValue>&()[1], TCIMValue("text"));
}

TEST(TStoredValueTest, ANullReferenceKeepsItsClass) {
  auto const ns = NewNamespace();
  ns->DefineClass("X_A");
  TCIMValue reference = NullOf("reference");
  reference.SetReferencedClass(ns->GetClass("X_A", kNone));
  EXPECT_EQ(TStoredValue(reference).Get().GetReferencedClass(), ns->GetClass("X_A", kNone));
}

TEST(TStoredValueTest, OnlyTheBooleanFalseIsFalse) {
  EXPECT_TRUE(TStoredValue(TCIMValue(false)).IsFalse());
  for (TCIMValue const& value : {TCIMValue(true), NullOf("boolean"), TCIMValue(0u), TCIMValue("")})
    EXPECT_FALSE(TStoredValue(value).IsFalse());
}

}  // namespace
}  // namespace NQRVZEP20
