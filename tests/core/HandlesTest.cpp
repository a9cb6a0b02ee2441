// SPDX-License-Identifier: Apache-2.0
#include "core/Handles.h"

#include <fcntl.h>
#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

bool IsOpen(int fd) { return ::fcntl(fd, F_GETFD) != -1; }

TEST(TUniqueFdTest, ClosesWhenItGoesOutOfScope) {
  int fd;
  {
    TUniqueFd const owner(::open("/dev/null", O_RDONLY));
    fd = owner.get();
    EXPECT_TRUE(owner);
    EXPECT_TRUE(IsOpen(fd));
  }
  EXPECT_FALSE(IsOpen(fd));
}

TEST(TUniqueFdTest, MovingTransfersTheDescriptor) {
  TUniqueFd first(::open("/dev/null", O_RDONLY));
  int const fd = first.get();
  TUniqueFd second(std::move(first));
  EXPECT_FALSE(first);
  EXPECT_EQ(second.get(), fd);
  TUniqueFd third(::open("/dev/null", O_RDONLY));
  int const replaced = third.get();
  third = std::move(second);
  EXPECT_FALSE(IsOpen(replaced));
  EXPECT_EQ(third.get(), fd);
}

TEST(TUniqueFdTest, ReleaseDoesNotClose) {
  TUniqueFd owner(::open("/dev/null", O_RDONLY));
  int const fd = owner.release();
  owner.reset();
  EXPECT_TRUE(IsOpen(fd));
  ::close(fd);
}

TEST(TUniqueFdTest, AFailedOpenOwnsNothing) {
  TUniqueFd const owner(::open("/nonexistent", O_RDONLY));
  EXPECT_FALSE(owner);
}

TEST(TUniqueFdTest, ClosingKeepsTheReasonOfAFailure) {
  int closed;
  {
    TUniqueFd const owner(::open("/dev/null", O_RDONLY));
    closed = owner.get();
  }
  {
    TUniqueFd const owner(closed);  // cannot be closed again
    errno = ENOSPC;
  }
  EXPECT_EQ(errno, ENOSPC);
}

}  // namespace
}  // namespace NQRVZEP20
