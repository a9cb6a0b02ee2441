// SPDX-License-Identifier: Apache-2.0
#include "providers/devices/PciLink.h"

#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

TEST(PciLinkTest, TheKernelWritesTransferRatesWithAUnit) {
  struct TRow {
    char const* fText;
    float fRate;
  } const rows[] = {{"2.5 GT/s PCIe", 2.5f}, {"5.0 GT/s PCIe", 5}, {"8 GT/s", 8}, {"16.0 GT/s PCIe", 16}, {"64.0 GT/s PCIe", 64}};
  for (TRow const& row : rows) EXPECT_EQ(*PciTransferRateFrom(row.fText), row.fRate) << row.fText;
}

TEST(PciLinkTest, OtherTextsAreNotTransferRates) {
  EXPECT_EQ(PciTransferRateFrom("Unknown").Why().fCode, kMissingNotGiven);
  for (char const* text : {"", "2.5", "GT/s", "-1 GT/s", "0 GT/s", "2.5 MT/s", "nan GT/s", "inf GT/s", "99999 GT/s", "2.5GT/s"}) {
    auto const rate = PciTransferRateFrom(text);
    ASSERT_FALSE(rate) << text;
    EXPECT_EQ(rate.Why().fCode, kMissingUnexpected) << text;
  }
}

TEST(PciLinkTest, AnUnknownWidthIsMissing) {
  EXPECT_EQ(*PciWidthFrom(16), 16);
  for (std::uint16_t const width : {0, 255}) EXPECT_EQ(PciWidthFrom(width).Why().fReason, "the kernel reports it as unknown");
}

TEST(PciLinkTest, TheDataRateIsWithoutTheOverheadOfTheEncoding) {
  struct TRow {
    float fRate;
    std::uint16_t fWidth;
    std::uint64_t fSpeed;
  } const rows[] = {{2.5f, 1, 2000000000},  {5, 4, 16000000000},    {8, 1, 7876923077},
                    {16, 16, 252061538462}, {32, 16, 504123076923}, {64, 16, 1024000000000}};
  for (TRow const& row : rows) EXPECT_EQ(PciSpeedFrom(row.fRate, row.fWidth), row.fSpeed) << row.fRate << " x" << row.fWidth;
}

}  // namespace
}  // namespace NQRVZEP20
