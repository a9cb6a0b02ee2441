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

// The environment is not searched each time: other variables come and go, and TZ is found in any place.
TEST(TimeZoneTest, ChangesAreFoundAmongThoseOfOtherVariables) {
  TEnvironmentGuard const guard("TZ", nullptr), one("ZEP_TEST_ONE", nullptr), two("ZEP_TEST_TWO", nullptr);
  TTimeZone zone;
  EXPECT_TRUE(zone.HasChanged());
  ::setenv("ZEP_TEST_ONE", "1", 1);
  EXPECT_FALSE(zone.HasChanged());
  ::setenv("TZ", "UTC0", 1);
  EXPECT_TRUE(zone.HasChanged());
  ::setenv("ZEP_TEST_TWO", "2", 1);
  ::unsetenv("ZEP_TEST_ONE");
  EXPECT_FALSE(zone.HasChanged());
  ::unsetenv("TZ");
  ::setenv("ZEP_TEST_ONE", "1", 1);
  EXPECT_TRUE(zone.HasChanged());
  ::unsetenv("ZEP_TEST_ONE");
  ::setenv("TZ", "UTC0", 1);  // as many variables as before
  EXPECT_TRUE(zone.HasChanged());
  EXPECT_FALSE(zone.HasChanged());
}

TEST(TimeZoneTest, ATextThatIsChangedInPlaceHasChanged) {
  TEnvironmentGuard const guard("TZ", nullptr);
  TTimeZone zone;
  static char entry[] = "TZ=XST-1";
  ::putenv(entry);
  EXPECT_TRUE(zone.HasChanged());
  EXPECT_FALSE(zone.HasChanged());
  entry[7] = '2';
  EXPECT_TRUE(zone.HasChanged());
  EXPECT_FALSE(zone.HasChanged());
  ::unsetenv("TZ");
}

TEST(TimeZoneTest, AnotherEnvironmentHasAnotherZone) {
  TEnvironmentGuard const guard("TZ", "UTC0");
  TTimeZone zone;
  EXPECT_TRUE(zone.HasChanged());
  char** const old = environ;
  char text[] = "TZ=XST-1";
  char *other[] = {text, nullptr}, *none[] = {nullptr};
  for (char** const environment : {other, none, static_cast<char**>(nullptr), old}) {
    environ = environment;
    EXPECT_TRUE(zone.HasChanged() || environment == nullptr) << "an empty environment has no zone, like none";
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
