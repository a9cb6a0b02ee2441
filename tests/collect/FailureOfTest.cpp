// SPDX-License-Identifier: Apache-2.0
#include "collect/FailureOf.h"

#include "TZEPException.h"

#include <gtest/gtest.h>

#include <new>
#include <stdexcept>

namespace NQRVZEP20 {
namespace {

TEST(FailureOfTest, IsEmptyAfterSuccess) {
  EXPECT_EQ(FailureOf([] {}), "");
}

TEST(FailureOfTest, NamesWhatWasThrown) {
  EXPECT_EQ(FailureOf([] { throw std::runtime_error("the disk is full"); }), "the disk is full");
  EXPECT_EQ(FailureOf([] { throw TZEPException(kZEPStatusAccessDenied); }), "kZEPStatusAccessDenied");
}

TEST(FailureOfTest, ObjectsThatAreNotExceptionsAreCaught) {
  EXPECT_EQ(FailureOf([] { throw std::runtime_error(""); }), "it threw an exception without a text");
  EXPECT_EQ(FailureOf([] { throw 5; }), "it threw an object that is not a std::exception");
}

struct TNoText : std::exception {
  char const* what() const noexcept override { return nullptr; }
};

TEST(FailureOfTest, TheTextOfAnExceptionMayBeMissing) {
  EXPECT_EQ(FailureOf([] { throw TNoText(); }), "it threw an exception without a text");
  EXPECT_EQ(FailureOf([] { throw std::bad_alloc(); }), "std::bad_alloc");
}

}  // namespace
}  // namespace NQRVZEP20
