// SPDX-License-Identifier: Apache-2.0
#include "core/TimeZone.h"

#include "tests/Support.h"

#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

TEST(TimeZoneTest, EachChangeIsReportedOnce) {
  TEnvironmentGuard const guard("TZ", nullptr);
  TTimeZone zone;
  EXPECT_TRUE(zone.HasChanged()) << "the first time, also without a TZ";
  std::string const longest(63, 'x');
  char const* const texts[] = {"UTC0", "XST-1", "", nullptr, longest.c_str(), "UTC0", nullptr, ""};
  for (char const* const text : texts) {
    SCOPED_TRACE(text ? text : "no TZ");
    TEnvironmentGuard const set("TZ", text);
    EXPECT_TRUE(zone.HasChanged());
    EXPECT_FALSE(zone.HasChanged());
  }
}

TEST(TimeZoneTest, ATooLongTextIsReportedAsChangedEachTime) {
  TEnvironmentGuard const guard("TZ", std::string(64, 'x').c_str());
  TTimeZone zone;
  EXPECT_TRUE(zone.HasChanged());
  EXPECT_TRUE(zone.HasChanged());
  ::setenv("TZ", "UTC0", 1);
  EXPECT_TRUE(zone.HasChanged());
  EXPECT_FALSE(zone.HasChanged());
}

TEST(TimeZoneTest, EachObjectReportsAChangeByItself) {
  TEnvironmentGuard const guard("TZ", "UTC0");
  TTimeZone one, another;
  EXPECT_TRUE(one.HasChanged());
  EXPECT_TRUE(another.HasChanged());
}

}  // namespace
}  // namespace NQRVZEP20
