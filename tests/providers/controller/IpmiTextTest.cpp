// SPDX-License-Identifier: Apache-2.0
#include "providers/controller/IpmiText.h"

#include "tests/providers/controller/ControllerBytes.h"

#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

TEST(IpmiTextTest, EachFormIsDecoded) {
  EXPECT_EQ(*IpmiText(ETextForm::kBinary, Bytes({0x0A, 0xFF})), "0aff");
  EXPECT_EQ(*IpmiText(ETextForm::kBcdPlus, Bytes({0x12, 0x3B, 0x45})), "123-45");
  EXPECT_EQ(*IpmiText(ETextForm::kSixBit, Bytes({0x29, 0xDC, 0xA6})), "IPMI");
  EXPECT_EQ(*IpmiText(ETextForm::kEightBit, "Fan 1"), "Fan 1");
  EXPECT_EQ(*IpmiText(ETextForm::kEightBit, "T\xE9l\x07"), "T\xC3\xA9l?");
}

TEST(IpmiTextTest, BlanksAtTheEndsAreOmitted) {
  EXPECT_EQ(*IpmiText(ETextForm::kEightBit, "  A B  "), "A B");
  EXPECT_EQ(*IpmiText(ETextForm::kEightBit, std::string("A\0B", 3)), "A") << "a zero byte ends the text";
  EXPECT_FALSE(IpmiText(ETextForm::kEightBit, "   "));
  EXPECT_FALSE(IpmiText(ETextForm::kBinary, ""));
}

}  // namespace
}  // namespace NQRVZEP20
