// SPDX-License-Identifier: Apache-2.0
#include "collect/redaction/TSecretIndex.h"

#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

// The text with each spelling of the user "(bob)" replaced by "X".
std::string WithoutBob(std::string const& text) {
  TSecretIndex index;
  index.Add(ESecretKind::kUsers, "(bob)");
  return index.Rewritten(text, [](TSecret const*, std::string const&) { return "X"; }).value_or(text);
}

TEST(TSecretIndexTest, ASecretIsFoundWithItsSignsOrWithoutThem) {
  EXPECT_EQ(WithoutBob("by (bob) or bob"), "by X or X");
  EXPECT_EQ(WithoutBob("bobby"), "bobby");
}

TEST(TSecretIndexTest, NoReplacementJoinsItsNeighbour) {
  EXPECT_EQ(WithoutBob("a(bob)b"), "a(X)b");
  EXPECT_EQ(WithoutBob("(Bob)(bob)"), "X(X)");
}

}  // namespace
}  // namespace NQRVZEP20
