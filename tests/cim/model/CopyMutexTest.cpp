// The header alone: a caller that holds the mutex includes nothing else for it.

#include "TCIMCopy.h"

#include <gtest/gtest.h>

namespace {

TEST(CopyMutexTest, CanBeHeldWithTheHeaderAlone) {
  boost::recursive_mutex::scoped_lock l(copyInstMutex);
  EXPECT_TRUE(l.owns_lock());
}

TEST(CopyMutexTest, IsOneMutexUnderBothNames) {
  EXPECT_EQ(&::copyInstMutex, &NQRVZEP20::copyInstMutex);
  using namespace NQRVZEP20;
  EXPECT_EQ(&copyInstMutex, &::copyInstMutex);
}

}  // namespace
