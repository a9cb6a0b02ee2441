// SPDX-License-Identifier: Apache-2.0
#include "providers/reasons/TFinding.h"

#include <gtest/gtest.h>

#include <string>

namespace NQRVZEP20 {
namespace {

TMissing const kMissing{kMissingNeedsRoot, "needs root"};

TFinding<int> HalfOf(int number) {
  if (number % 2 != 0) return TMissing{kMissingUnexpected, std::to_string(number) + " is odd"};
  return number / 2;
}

TEST(TFindingTest, AValueIsFound) {
  TFinding<std::string> const found(std::string("value"));
  ASSERT_TRUE(found);
  EXPECT_EQ(*found, "value");
  EXPECT_EQ(found->size(), 5u);
  EXPECT_THROW(found.Why(), std::bad_variant_access);
}

TEST(TFindingTest, AMissingValueHasAReason) {
  TFinding<std::string> const missing(kMissing);
  ASSERT_FALSE(missing);
  EXPECT_EQ(missing.Why().fCode, "needs-root");
  EXPECT_EQ(missing.Why().fReason, "needs root");
  EXPECT_THROW(*missing, std::bad_variant_access);
}

TEST(TFindingTest, AFalseValueIsFound) {
  ASSERT_TRUE(TFinding<bool>(false));
  EXPECT_FALSE(*TFinding<bool>(false));
}

TEST(TFindingTest, ThenPassesTheValueToAFunctionThatReturnsAValue) {
  TFinding<std::string> const text = TFinding<int>(7).Then([](int number) { return std::to_string(number); });
  ASSERT_TRUE(text);
  EXPECT_EQ(*text, "7");
}

TEST(TFindingTest, ThenPassesTheValueToAFunctionThatReturnsAFinding) {
  EXPECT_EQ(*TFinding<int>(12).Then(HalfOf), 6);
  EXPECT_EQ(*TFinding<int>(12).Then(HalfOf).Then(HalfOf), 3);
}

TEST(TFindingTest, ThenReturnsTheReasonOfTheFunctionThatFailed) {
  TFinding<int> const result = TFinding<int>(12).Then(HalfOf).Then(HalfOf).Then(HalfOf).Then(HalfOf);
  ASSERT_FALSE(result);
  EXPECT_EQ(result.Why().fReason, "3 is odd");
}

TEST(TFindingTest, ThenCallsNothingWhenTheValueIsMissing) {
  bool isCalled = false;
  TFinding<std::string> const result = TFinding<int>(kMissing).Then([&](int) {
    isCalled = true;
    return std::string("called");
  });
  ASSERT_FALSE(result);
  EXPECT_EQ(result.Why().fReason, "needs root");
  EXPECT_FALSE(isCalled);
}

}  // namespace
}  // namespace NQRVZEP20
