// SPDX-License-Identifier: Apache-2.0

// Includes no other header of the library: a caller that locks the mutex needs only this one.

#include "TCIMCopy.h"

#include <gtest/gtest.h>

namespace {

TEST(CopyMutexTest, CanBeLockedWithOnlyItsHeader) {
  boost::recursive_mutex::scoped_lock l(copyInstMutex);
  EXPECT_TRUE(l.owns_lock());
}

TEST(CopyMutexTest, IsOneMutexUnderBothNames) {
  EXPECT_EQ(&::copyInstMutex, &NQRVZEP20::copyInstMutex);
  using namespace NQRVZEP20;
  EXPECT_EQ(&copyInstMutex, &::copyInstMutex);
}

}  // namespace
