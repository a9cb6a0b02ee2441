// SPDX-License-Identifier: Apache-2.0
#include "TZEPFailure.h"

#include "tests/Support.h"

#include <gtest/gtest.h>

#include <exception>
#include <optional>
#include <type_traits>

namespace NQRVZEP20 {
namespace {

TEST(TZEPFailureTest, CarriesTheCodeAndTheReason) {
  TZEPFailure const failure(kZEPStatusNotFound, "there is no class X_Disk");
  EXPECT_EQ(failure.Reason(), "there is no class X_Disk");
  EXPECT_STREQ(failure.what(), "kZEPStatusNotFound");
  EXPECT_EQ(failure.GetStatusCode(), kZEPStatusNotFound);
}

TEST(TZEPFailureTest, CopyingDoesNotThrowAndSharesTheReason) {
  static_assert(std::is_nothrow_copy_constructible_v<TZEPFailure>);
  static_assert(std::is_nothrow_move_constructible_v<TZEPFailure>);
  static_assert(std::is_nothrow_copy_assignable_v<TZEPFailure>);
  std::optional<TZEPFailure> original(std::in_place, kZEPStatusFail, "a reason");
  std::string const* const text = &original->Reason();
  TZEPFailure const copy(*original), moved(std::move(*original));
  EXPECT_EQ(&original->Reason(), text) << "an exception that was moved from keeps its reason";
  original.reset();
  EXPECT_EQ(&copy.Reason(), text);
  EXPECT_EQ(moved.Reason(), "a reason");
}

TEST(TZEPFailureTest, IsCaughtAsItsBases) {
  auto const thrower = [] { throw TZEPFailure(kZEPStatusFail, "a reason"); };
  EXPECT_THROW(thrower(), TZEPFailure);
  EXPECT_STATUS(thrower(), kZEPStatusFail);
  EXPECT_THROW(thrower(), std::exception);
}

// The exception is thrown in libzepcore.so and caught here.
TEST(TZEPFailureTest, ThrownByTheLibraryIsCaughtInAProgram) {
  EXPECT_EQ(ReasonOf([] { TRootObject::GetNamespaceProviderManager()->GetNamespaceProvider("Nothing"); }),
            "Failed to find nsp named Nothing");
}

}  // namespace
}  // namespace NQRVZEP20
