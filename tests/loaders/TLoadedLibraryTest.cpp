// SPDX-License-Identifier: Apache-2.0
#include "loaders/TLoadedLibrary.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

using testing::HasSubstr;

std::vector<std::string> gNames;  // of the next library

template <TLibraryFunction::ENeed kNeedOfOther>
struct TSmallFunctions {
  int (*fNumber)() = nullptr;
  int (*fOther)() = nullptr;

  static TLibraryPlace Place() { return {gNames, RTLD_NOW}; }
  std::vector<TLibraryFunction> Table() { return {{"SmallNumber", fNumber}, {"SmallOther", fOther, kNeedOfOther}}; }
};

using TSmall = TLoadedLibrary<TSmallFunctions<TLibraryFunction::kOptional>>;
using TWithOther = TLoadedLibrary<TSmallFunctions<TLibraryFunction::kRequired>>;

bool IsLoaded(char const* library) { return TSharedLibrary(::dlopen(library, RTLD_NOW | RTLD_NOLOAD)) != nullptr; }

TEST(TLoadedLibraryTest, TheFirstNameThatCanBeLoadedIsUsed) {
  gNames = {"/nothing/here.so", SMALL_SECOND, SMALL_FIRST};
  TSmall const library;
  ASSERT_TRUE(library.Outcome()) << library.Outcome().fReason;
  EXPECT_EQ(library->fNumber(), 2);
  EXPECT_FALSE(IsLoaded(SMALL_FIRST));
}

TEST(TLoadedLibraryTest, AnOptionalFunctionThatIsMissingIsNull) {
  gNames = {SMALL_FIRST};
  TSmall const library;
  EXPECT_TRUE(library.Outcome());
  EXPECT_EQ(library->fOther, nullptr);
}

TEST(TLoadedLibraryTest, TheLibraryIsClosedWithTheObject) {
  gNames = {SMALL_FIRST};
  {
    TSmall const library;
    EXPECT_TRUE(IsLoaded(SMALL_FIRST));
  }
  EXPECT_FALSE(IsLoaded(SMALL_FIRST));
}

TEST(TLoadedLibraryTest, WithoutALibraryTheLastNameIsTheReason) {
  gNames = {"/nothing/here.so", "/nothing/there.so"};
  TSmall const library;
  EXPECT_FALSE(library.Outcome());
  EXPECT_EQ(library.Outcome().fKind, TLoadOutcome::kNotLoaded);
  EXPECT_THAT(library.Outcome().fReason, HasSubstr("/nothing/there.so: cannot open shared object file"));
}

TEST(TLoadedLibraryTest, AMissingRequiredFunctionIsNamedAndTheLibraryClosed) {
  struct TRow {
    char const *fLibrary, *fFunction;
  };
  for (TRow const& row : {TRow{SMALL_FIRST, "SmallOther"}, TRow{SMALL_EMPTY, "SmallNumber"}}) {
    gNames = {row.fLibrary, SMALL_SECOND};
    TWithOther const library;
    EXPECT_EQ(library.Outcome().fKind, TLoadOutcome::kFunctionMissing);
    EXPECT_THAT(library.Outcome().fReason, HasSubstr(std::string("undefined symbol: ") + row.fFunction));
    EXPECT_FALSE(IsLoaded(row.fLibrary));
  }
}

TEST(TLoadedLibraryTest, EachOutcomeHasAStatusOfItsOwn) {
  EXPECT_EQ(StatusOf(TLoadOutcome{}), kZEPStatusOK);
  EXPECT_EQ(StatusOf({TLoadOutcome::kNotLoaded, ""}), kZEPStatusFileSystemError);
  EXPECT_EQ(StatusOf({TLoadOutcome::kFunctionMissing, ""}), kZEPStatusNotFound);
}

}  // namespace
}  // namespace NQRVZEP20
