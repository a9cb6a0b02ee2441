// SPDX-License-Identifier: Apache-2.0
#include "TCIMValueImpl.h"

#include "TCIMReference.h"
#include "tests/Support.h"

#include <cstdint>
#include <cstring>

namespace NQRVZEP20 {
namespace {

// A kind that supports printing only.
class TMuteImpl : public TCIMValueImpl {
public:
  std::string ToString(unsigned char) const override { return "mute"; }
  bool operator==(TCIMValue const&) const override { return false; }
  bool operator<(TCIMValue const&) const override { return false; }
};

TEST(TCIMValueImplTest, TheBaseRefusesEveryConversion) {
  TMuteImpl const data;
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
  EXPECT_STATUS(data.operator TCIMDateTime(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator TCIMReference(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator std::vector<TCIMValue>&(), kZEPStatusTypeMismatch);
}

// Plug-ins are compiled against this order. The two destructors have the slots 1 and 2.
TEST(TCIMValueImplTest, VirtualOperationsKeepTheirSlots) {
  EXPECT_EQ(SlotOf(&TCIMValueImpl::operator bool), 3u);
  EXPECT_EQ(SlotOf(&TCIMValueImpl::operator unsigned char), 4u);
  EXPECT_EQ(SlotOf(&TCIMValueImpl::operator signed char), 5u);
  EXPECT_EQ(SlotOf(&TCIMValueImpl::operator unsigned short), 6u);
  EXPECT_EQ(SlotOf(&TCIMValueImpl::operator short), 7u);
  EXPECT_EQ(SlotOf(&TCIMValueImpl::operator unsigned int), 8u);
  EXPECT_EQ(SlotOf(&TCIMValueImpl::operator int), 9u);
  EXPECT_EQ(SlotOf(&TCIMValueImpl::operator unsigned long), 10u);
  EXPECT_EQ(SlotOf(&TCIMValueImpl::operator long), 11u);
  EXPECT_EQ(SlotOf(&TCIMValueImpl::operator float), 12u);
  EXPECT_EQ(SlotOf(&TCIMValueImpl::operator double), 13u);
  EXPECT_EQ(SlotOf(&TCIMValueImpl::operator std::string), 14u);
  EXPECT_EQ(SlotOf(&TCIMValueImpl::operator TCIMChar16), 15u);
  EXPECT_EQ(SlotOf(&TCIMValueImpl::operator TCIMDateTime), 16u);
  EXPECT_EQ(SlotOf(&TCIMValueImpl::operator TCIMReference), 17u);
  EXPECT_EQ(SlotOf(&TCIMValueImpl::operator std::vector<TCIMValue>&), 18u);
  EXPECT_EQ(SlotOf(&TCIMValueImpl::ToString), 19u);
  EXPECT_EQ(SlotOf(&TCIMValueImpl::operator==), 20u);
  EXPECT_EQ(SlotOf(&TCIMValueImpl::operator<), 21u);
}

}  // namespace
}  // namespace NQRVZEP20
