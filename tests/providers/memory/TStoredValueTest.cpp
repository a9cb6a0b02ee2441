// SPDX-License-Identifier: Apache-2.0
#include "TStoredValue.h"

#include "Collect.h"

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
