// SPDX-License-Identifier: Apache-2.0
#include "providers/devices/PciAddress.h"

#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

TEST(PciAddressTest, AnAddressHasFourParts) {
  auto const address = PciAddressFrom("10000:e1:1f.7");
  ASSERT_TRUE(address);
  EXPECT_EQ(address->fDomain, 0x10000u);
  EXPECT_EQ(address->fBus, 0xe1);
  EXPECT_EQ(address->fDevice, 0x1f);
  EXPECT_EQ(address->fFunction, 7);
}

TEST(PciAddressTest, OtherTextsAreNotAddresses) {
  for (char const* text : {"", "pci0000:00", "0000:00", "0000:00:1f", "0000:00:20.0", "0000:00:1f.8", "0000:00:1f.0x",
                           "0000:00:1f.0:pcie001", "0000:100:00.0", " 0000:00:1f.0 "})
    EXPECT_FALSE(PciAddressFrom(text)) << text;
}

}  // namespace
}  // namespace NQRVZEP20
