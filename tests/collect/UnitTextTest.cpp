// SPDX-License-Identifier: Apache-2.0
#include "collect/UnitText.h"

#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

TEST(UnitTextTest, ANumberIsShortenedAsItsUnitDemands) {
  struct TRow {
    unsigned long fNumber;
    char const* fUnit;
    char const* fText;
  } const rows[] = {
      {0, "byte", "0 B"},
      {1023, "byte", "1023 B"},
      {1536, "byte", "1.5 KiB"},
      {34359738368, "byte", "32 GiB"},
      {268435, "byte * 10^3", "256 MiB"},
      {8, "byte * 2^10", "8 KiB"},
      {1000000000, "bit / second", "1 Gbit/s"},
      {2500000000, "bit / second", "2.5 Gbit/s"},
      {2300, "hertz * 10^6", "2.3 GHz"},
      {2933, "hertz * 10^6", "2.933 GHz"},
      {800, "hertz * 10^6", "800 MHz"},
      {7200, "revolution / minute", "7200 rpm"},
      {45, "degree celsius", "45 °C"},
      {11500, "volt * 10^-3", "11.5 V"},
      {97, "percent", "97 %"},
      {3, "rack unit", "3 rack unit"},
      {3, "second * 250 * 10^-9", "3 second * 250 * 10^-9"},
      {3, "", "3"},
  };
  for (TRow const& row : rows) EXPECT_EQ(TextWithUnit(TCIMValue(row.fNumber), row.fUnit), row.fText);
}

TEST(UnitTextTest, ARealNumberIsRounded) { EXPECT_EQ(TextWithUnit(TCIMValue(2.26), "byte"), "2.3 B"); }

TEST(UnitTextTest, ATextIsPrintedAlone) {
  EXPECT_EQ(TextWithUnit(TCIMValue("8 GB"), "byte"), "8 GB");
  EXPECT_EQ(TextWithUnit(TCIMValue(true), "byte"), "true");
}

}  // namespace
}  // namespace NQRVZEP20
