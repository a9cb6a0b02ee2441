// SPDX-License-Identifier: Apache-2.0
#include "providers/mof/MofNumbers.h"

#include "tests/providers/mof/MofTexts.h"

#include <limits>

namespace NQRVZEP20 {
namespace {

TEST(MofNumbersTest, ANumberThatDoesNotFitItsTypeIsRefused) {
  ExpectErrors({
      {"class X_A { uint8 P = 256; };", "2:23: the number is out of the range of uint8"},
      {"class X_A { uint8 P = -1; };", "2:23: the number is out of the range of uint8"},
      {"class X_A { sint8 P = 128; };", "2:23: the number is out of the range of sint8"},
      {"class X_A { sint64 P = -9223372036854775809; };", "2:24: the number is out of the range of sint64"},
      {"class X_A { uint64 P = 18446744073709551616; };", "2:24: the number is out of the range of uint64"},
      {"class X_A { uint8 P = 1.5; };", "2:23: expected an integer"},
      {"class X_A { uint8 P = 08; };", "2:23: expected an integer"},
      {"class X_A { uint8 P = 0x; };", "2:23: expected an integer"},
      {"class X_A { uint8 P = 12b; };", "2:23: expected an integer"},
      {"class X_A { uint8 P = 1x; };", "2:23: expected an integer"},
      {"class X_A { real32 P = 1e99; };", "2:24: the number is out of the range of real32"},
      {"class X_A { real64 P = 1.2.3; };", "2:24: expected a number"},
      {"class X_A { char16 P = 65536; };", "2:24: the number is out of the range of uint16"},
  });
}

TEST(MofNumbersTest, ANumberIsReadInItsBaseAndType) {
  struct TRow {
    char const* fText;
    TType fType;
    TCIMValue fValue;
  };
  TMofFile const file{"numbers", "1"};
  for (TRow const& row : {TRow{"0x1F", TType::kCIMTypeUint32, TCIMValue(31u)}, TRow{"017", TType::kCIMTypeUint32, TCIMValue(15u)},
                          TRow{"101b", TType::kCIMTypeUint32, TCIMValue(5u)}, TRow{"0", TType::kCIMTypeUint32, TCIMValue(0u)},
                          TRow{"-0x80", TType::kCIMTypeSint8, TCIMValue(static_cast<signed char>(-128))},
                          TRow{"65", TType::kCIMTypeChar16, TCIMValue(TCIMChar16(65))},
                          TRow{"-1.5e2", TType::kCIMTypeReal32, TCIMValue(-150.0f)}}) {
    SCOPED_TRACE(row.fText);
    EXPECT_EQ(ReadMofNumber(row.fText, row.fType, {&file, file.fText}), row.fValue);
  }
}

TEST(MofNumbersTest, ANumberIsNotAValueOfAnotherKindOfType) {
  TMofFile const file{"numbers", "1"};
  for (TType const type : {TType::kCIMTypeString, TType::kCIMTypeBoolean, TType::kCIMTypeDateTime, TType::kCIMTypeReference})
    EXPECT_EQ(StatusOf([&] { ReadMofNumber("1", type, {&file, file.fText}); }), kZEPStatusInvalidFormat) << type.ToString();
}

TEST(MofNumbersTest, ARealHasAPointAndEveryDigitThatItNeeds) {
  EXPECT_EQ(MofRealText(0.1), "0.1");
  EXPECT_EQ(MofRealText(0.1f), "0.1");
  EXPECT_EQ(MofRealText(3.0), "3.0");
  EXPECT_EQ(MofRealText(-0.0), "-0.0");
  EXPECT_EQ(MofRealText(1e300), "1.0e+300");
  EXPECT_EQ(MofRealText(0.1 + 0.2), "0.30000000000000004");
  EXPECT_STATUS(MofRealText(std::numeric_limits<double>::infinity()), kZEPStatusNotSupported);
  EXPECT_STATUS(MofRealText(std::numeric_limits<float>::quiet_NaN()), kZEPStatusNotSupported);
}

}  // namespace
}  // namespace NQRVZEP20
