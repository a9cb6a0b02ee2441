// SPDX-License-Identifier: Apache-2.0
#include "TCIMStringValueImpl.h"

#include "TCIMReference.h"
#include "tests/Support.h"

namespace NQRVZEP20 {
namespace {

using TImpl = TCIMStringValueImpl;

std::string const kWithZero("a\0b", 3);

TEST(TCIMStringValueImplTest, ReturnsItsTextUnchanged) {
  for (std::string const& text : {std::string(), std::string("  a \"b\" \\ \n"), std::string("\xFF\x80"), kWithZero}) {
    TImpl const data(text);
    EXPECT_EQ(data.operator std::string(), text);
    for (int radix : {0, 2, 8, 10, 16, 255}) EXPECT_EQ(data.ToString(static_cast<unsigned char>(radix)), text) << radix;
    EXPECT_EQ(TImpl(data).operator std::string(), text);
  }
  EXPECT_EQ(TImpl("chars").operator std::string(), "chars");
}

TEST(TCIMStringValueImplTest, RefusesEveryOtherConversion) {
  TImpl const data("1");
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
  EXPECT_STATUS(data.operator TCIMChar16(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator TCIMDateTime(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator TCIMReference(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator std::vector<TCIMValue>&(), kZEPStatusTypeMismatch);
}

// From least to greatest.
std::string const kAscending[] = {"",    std::string(1, '\0'), "Ab", "a", kWithZero, "ab", "abc", "abd", "b", "\x7F", "\x80",
                                  "\xFF"};

TEST(TCIMStringValueImplTest, OrdersByUnsignedBytesAndThenByLength) {
  for (std::size_t i = 0; i < std::size(kAscending); ++i)
    for (std::size_t j = 0; j < std::size(kAscending); ++j) {
      SCOPED_TRACE("'" + kAscending[i] + "' and '" + kAscending[j] + "'");
      EXPECT_EQ(TImpl(kAscending[i]) < TCIMValue(kAscending[j]), i < j);
      EXPECT_EQ(TImpl(kAscending[i]) == TCIMValue(kAscending[j]), i == j);
    }
}

TEST(TCIMStringValueImplTest, IsNeitherEqualNorLessAcrossTypes) {
  TImpl const data("1");
  for (TCIMValue const& other : {TCIMValue(1u), TCIMValue(TCIMChar16(49)), TCIMValue(TCIMDateTime()), TCIMValue(true),
                                 TCIMValue(TCIMValue::TCIMType::kCIMTypeString, 0, {TCIMValue("1")}), TCIMValue()}) {
    EXPECT_FALSE(data == other) << int(other.GetType());
    EXPECT_FALSE(data < other) << int(other.GetType());
  }
}

TEST(TCIMStringValueImplTest, ComparingWithANullStringThrowsValueIsNull) {
  TCIMValue const null(TCIMValue::TCIMType::kCIMTypeString, 0);
  EXPECT_STATUS((void)(TImpl("a") == null), kZEPStatusValueIsNULL);
  EXPECT_STATUS((void)(TImpl("a") < null), kZEPStatusValueIsNULL);
}

}  // namespace
}  // namespace NQRVZEP20
