// SPDX-License-Identifier: Apache-2.0
#include "TCIMDateTimeValueImpl.h"

#include "TCIMReference.h"
#include "tests/Support.h"

#include <memory>

namespace NQRVZEP20 {
namespace {

constexpr char kText[] = "20070315143000.000000+060";

TCIMDateTime At(char const* text) { return TCIMDateTime(std::string(text)); }

class TCIMDateTimeValueImplTest : public testing::Test {
protected:
  TEnvironmentGuard fZone{"TZ", "UTC0"};
};

TEST_F(TCIMDateTimeValueImplTest, HoldsItsOwnCopy) {
  TCIMDateTime dateTime = At(kText);
  TCIMDateTimeValueImpl const data(dateTime);
  dateTime.Clear();
  EXPECT_EQ(data.operator TCIMDateTime().ToString(), kText);

  data.operator TCIMDateTime().Clear();
  EXPECT_EQ(data.ToString(10), kText);
}

TEST_F(TCIMDateTimeValueImplTest, CopiesShareNothing) {
  auto original = std::make_unique<TCIMDateTimeValueImpl>(At(kText));
  TCIMDateTimeValueImpl const copy(*original);
  original.reset();
  EXPECT_EQ(copy.ToString(10), kText);
}

TEST_F(TCIMDateTimeValueImplTest, TextIsTheSameInEveryRadix) {
  TCIMDateTimeValueImpl const data(At(kText));
  for (unsigned char const radix : {0, 2, 8, 10, 16, 255}) EXPECT_EQ(data.ToString(radix), kText) << static_cast<int>(radix);
}

TEST_F(TCIMDateTimeValueImplTest, NullDatetimeHasNoText) {
  EXPECT_STATUS(TCIMDateTimeValueImpl(TCIMDateTime()).ToString(10), kZEPStatusInvalidDateTime);
}

TEST_F(TCIMDateTimeValueImplTest, ConvertsToADatetimeOnly) {
  TCIMDateTimeValueImpl const data(At(kText));
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
  EXPECT_STATUS(data.operator TCIMChar16(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator TCIMReference(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator std::vector<TCIMValue>&(), kZEPStatusTypeMismatch);
}

TEST_F(TCIMDateTimeValueImplTest, ComparesLikeTheDatetimes) {
  TCIMDateTimeValueImpl const data(At(kText));
  EXPECT_TRUE(data == TCIMValue(At("20070315133000.000000+000")));
  EXPECT_FALSE(data == TCIMValue(At("20070315143000.000001+060")));
  EXPECT_FALSE(data < TCIMValue(At("20070315133000.000000+000")));
  EXPECT_TRUE(data < TCIMValue(At("20070315143000.000001+060")));
  EXPECT_FALSE(data < TCIMValue(At("20070315142959.999999+060")));
}

TEST_F(TCIMDateTimeValueImplTest, ComparingWithANullOrAnotherKindOfDatetimeThrows) {
  TCIMDateTimeValueImpl const data(At(kText));
  for (TCIMDateTime const& other : {TCIMDateTime(), TCIMDateTime(1, 0, 0, 0, 0)}) {
    EXPECT_STATUS(void(data == TCIMValue(other)), kZEPStatusInvalidDateTime);
    EXPECT_STATUS(void(data < TCIMValue(other)), kZEPStatusInvalidDateTime);
  }
}

TEST_F(TCIMDateTimeValueImplTest, IsNeitherEqualToNorLessThanAValueOfAnotherType) {
  TCIMDateTimeValueImpl const data(At(kText));
  TCIMValue const others[] = {
      TCIMValue(),
      TCIMValue(true),
      TCIMValue(5u),
      TCIMValue(TCIMChar16(65)),
      TCIMValue(std::string(kText)),
      TCIMValue(TCIMValue::TCIMType::kCIMTypeDateTime, 1, {TCIMValue(At(kText))}),
  };
  for (TCIMValue const& other : others) {
    EXPECT_FALSE(data == other) << other.GetType();
    EXPECT_FALSE(data < other) << other.GetType();
  }
}

// Through TCIMValue.

TEST_F(TCIMDateTimeValueImplTest, ValueOfADatetimeReadsBackPrintsAndCompares) {
  TCIMValue const value(At(kText));
  EXPECT_EQ(value.GetType(), TCIMValue::TCIMType::kCIMTypeDateTime);
  EXPECT_EQ(value.operator TCIMDateTime().ToString(), kText);
  EXPECT_EQ(value.ToString(), kText);
  EXPECT_TRUE(value == TCIMValue(At("20070315133000.000000+000")));
  EXPECT_TRUE(value < TCIMValue(At("20070315143001.000000+060")));
  EXPECT_STATUS(value.operator std::string(), kZEPStatusTypeMismatch);
}

TEST_F(TCIMDateTimeValueImplTest, ValueHoldingANullDatetimeIsNotNullItself) {
  TCIMValue const value{TCIMDateTime()};
  EXPECT_FALSE(value.IsNull());
  EXPECT_TRUE(value.operator TCIMDateTime().IsNull());
  EXPECT_STATUS(value.ToString(), kZEPStatusInvalidDateTime);
}

}  // namespace
}  // namespace NQRVZEP20
