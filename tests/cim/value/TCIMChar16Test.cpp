// SPDX-License-Identifier: Apache-2.0
#include "TCIMChar16.h"

#include "TCIMChar16Impl.h"
#include "TCIMChar16ValueImpl.h"
#include "TCIMReference.h"
#include "tests/Support.h"

#include <boost/make_shared.hpp>

namespace NQRVZEP20 {
namespace {

TCIMChar16 NullCharacter() { return TCIMChar16(std::string("A")); }

// ---- The character ----

TEST(TCIMChar16Test, PrintsItsCodeNotALetter) {
  EXPECT_EQ(TCIMChar16(65).ToString(), "65");
  EXPECT_EQ(TCIMChar16(0).ToString(), "0");
  EXPECT_EQ(TCIMChar16(65535).ToString(), "65535");
  EXPECT_EQ(TCIMChar16(65).GetValue(), 65);
  EXPECT_EQ(TCIMChar16(65535).GetValue(), 65535);
}

TEST(TCIMChar16Test, ANewCharacterHasCodeZeroAndIsNotNull) {
  EXPECT_EQ(TCIMChar16().GetValue(), 0);
  EXPECT_EQ(TCIMChar16().ToString(), "0");
}

TEST(TCIMChar16Test, ACharacterFromAnyTextIsNull) {
  for (std::string const& text : {std::string("A"), std::string("65"), std::string()}) {
    SCOPED_TRACE(text);
    TCIMChar16 const character(text);
    EXPECT_STATUS(character.ToString(), kZEPStatusInvalidDateTime);
    EXPECT_EQ(character.GetValue(), 0);
  }
}

TEST(TCIMChar16Test, AnyTwoCharactersAreEqualAndEachIsLess) {
  TCIMChar16 const a(65), b(66);
  EXPECT_TRUE(a == b);
  EXPECT_TRUE(b == a);
  EXPECT_TRUE(a < b);
  EXPECT_TRUE(b < a);
  EXPECT_TRUE(a < a);
}

TEST(TCIMChar16Test, ComparingANullCharacterThrows) {
  TCIMChar16 const a(65), null = NullCharacter();
  EXPECT_STATUS((void)(a == null), kZEPStatusInvalidDateTime);
  EXPECT_STATUS((void)(null == a), kZEPStatusInvalidDateTime);
  EXPECT_STATUS((void)(null == null), kZEPStatusInvalidDateTime);
  EXPECT_STATUS((void)(a < null), kZEPStatusInvalidDateTime);
  EXPECT_STATUS((void)(null < a), kZEPStatusInvalidDateTime);
}

TEST(TCIMChar16Test, CopiesShareNothing) {
  TCIMChar16 first(65);
  TCIMChar16 const copy(first);
  TCIMChar16 assigned;
  assigned = first;
  first = NullCharacter();
  EXPECT_EQ(copy.ToString(), "65");
  EXPECT_EQ(assigned.ToString(), "65");
  EXPECT_STATUS(first.ToString(), kZEPStatusInvalidDateTime);

  TCIMChar16& itself = assigned;
  assigned = itself;
  EXPECT_EQ(assigned.ToString(), "65");
}

// ---- The body ----

TEST(TCIMChar16ImplTest, AnEmptyPointerIsAFailedAssertion) {
  TEnvironmentGuard const unset("ZEP_BOOST_ASSERT", nullptr);
  boost::shared_ptr<TCIMChar16Impl> const empty;
  EXPECT_STATUS((void)(TCIMChar16Impl(65) == empty), kZEPStatusFail);
  EXPECT_STATUS((void)(TCIMChar16Impl(65) < empty), kZEPStatusFail);
  EXPECT_STATUS((void)(TCIMChar16Impl(std::string("A")) == empty), kZEPStatusInvalidDateTime);  // its own NULL is checked first
}

TEST(TCIMChar16ImplTest, ComparesWithAnObjectAsWithAPointer) {
  TCIMChar16Impl const a(65), b(66), null(std::string("a"));
  EXPECT_TRUE(a == b);
  EXPECT_TRUE(a < b);
  EXPECT_TRUE(b < a);
  EXPECT_STATUS((void)(a == null), kZEPStatusInvalidDateTime);
  EXPECT_STATUS((void)(null < a), kZEPStatusInvalidDateTime);
}

TEST(TCIMChar16ImplTest, ComparisonIgnoresTheCodes) {
  auto const other = boost::make_shared<TCIMChar16Impl>((unsigned short)66);
  EXPECT_TRUE(TCIMChar16Impl(65) == other);
  EXPECT_TRUE(TCIMChar16Impl(67) < other);
  EXPECT_EQ(TCIMChar16Impl(65).GetValue(), 65);
  EXPECT_EQ(TCIMChar16Impl().ToString(), "0");
  EXPECT_STATUS((void)(TCIMChar16Impl(std::string()) < other), kZEPStatusInvalidDateTime);
}

// ---- As the data of a TCIMValue ----

TEST(TCIMChar16ValueImplTest, PrintsTheCodeInDecimalForAnyRadix) {
  TCIMChar16ValueImpl const data(TCIMChar16(255));
  for (int radix : {0, 2, 8, 10, 16}) EXPECT_EQ(data.ToString(static_cast<unsigned char>(radix)), "255") << radix;
  EXPECT_EQ(TCIMChar16ValueImpl(data).ToString(10), "255");
  EXPECT_EQ(data.operator TCIMChar16().GetValue(), 255);
}

TEST(TCIMChar16ValueImplTest, RefusesEveryOtherConversion) {
  TCIMChar16ValueImpl const data(TCIMChar16(1));
  EXPECT_STATUS(data.operator bool(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator unsigned char(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator signed char(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator unsigned short(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator short(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator unsigned int(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator int(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator unsigned long(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator long(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator float(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator double(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator std::string(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator TCIMDateTime(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator TCIMReference(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator std::vector<TCIMValue>&(), kZEPStatusTypeMismatch);
}

TEST(TCIMChar16ValueImplTest, AnyTwoCharactersAreEqualAndEachIsLess) {
  TCIMChar16ValueImpl const data(TCIMChar16(65));
  EXPECT_TRUE(data == TCIMValue(TCIMChar16(66)));
  EXPECT_TRUE(data < TCIMValue(TCIMChar16(64)));

  TCIMValue const a(TCIMChar16(65)), b(TCIMChar16(66));
  EXPECT_TRUE(a == b);
  EXPECT_TRUE(a < b);
  EXPECT_TRUE(b < a);
  EXPECT_FALSE(a >= b);
  EXPECT_TRUE(a <= b);
  EXPECT_FALSE(a > b);
}

TEST(TCIMChar16ValueImplTest, IsNeitherEqualNorLessAcrossTypes) {
  TCIMChar16ValueImpl const data(TCIMChar16(65));
  for (TCIMValue const& other : {TCIMValue("A"), TCIMValue((unsigned short)65), TCIMValue()}) {
    EXPECT_FALSE(data == other);
    EXPECT_FALSE(data < other);
  }
}

TEST(TCIMChar16ValueImplTest, ANullCharacterIsNotANullValue) {
  TCIMValue const value{NullCharacter()};
  EXPECT_FALSE(value.IsNull());
  EXPECT_STATUS(value.ToString(), kZEPStatusInvalidDateTime);
  EXPECT_STATUS((void)(value == TCIMValue(TCIMChar16(65))), kZEPStatusInvalidDateTime);
  EXPECT_STATUS((void)(TCIMValue(TCIMChar16(65)) < value), kZEPStatusInvalidDateTime);
  EXPECT_FALSE(value == TCIMValue("A"));
}

TEST(TCIMChar16ValueImplTest, ComparingWithANullValueThrowsValueIsNull) {
  TCIMValue const null(TCIMValue::TCIMType::kCIMTypeChar16, 0);
  EXPECT_STATUS((void)(TCIMChar16ValueImpl(TCIMChar16(65)) == null), kZEPStatusValueIsNULL);
  EXPECT_STATUS((void)(TCIMChar16ValueImpl(TCIMChar16(65)) < null), kZEPStatusValueIsNULL);
}

}  // namespace
}  // namespace NQRVZEP20
