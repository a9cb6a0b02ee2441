// SPDX-License-Identifier: Apache-2.0
#include "loaders/TKeptLibrary.h"

#include <gtest/gtest.h>

#include <set>
#include <thread>

namespace NQRVZEP20 {
namespace {

// Each test has a table of its own, because what is kept is kept for the process.
template <int kTest>
struct TNumberFunctions {
  int (*fNumber)() = nullptr;
  static std::string gName;

  static TLibraryPlace Place() { return {{gName}, RTLD_NOW}; }
  std::vector<TLibraryFunction> Table() { return {{"SmallNumber", fNumber}}; }
};
template <int kTest>
std::string TNumberFunctions<kTest>::gName;

TEST(TKeptLibraryTest, AFailureIsTriedAgainAndASuccessIsKept) {
  using TFunctions = TNumberFunctions<1>;
  TFunctions::gName = "/nothing/here.so";
  EXPECT_EQ(TKeptLibrary<TFunctions>::Get()->Outcome().fKind, TLoadOutcome::kNotLoaded);
  TFunctions::gName = SMALL_EMPTY;
  EXPECT_EQ(TKeptLibrary<TFunctions>::Get()->Outcome().fKind, TLoadOutcome::kFunctionMissing);
  TFunctions::gName = SMALL_SECOND;
  EXPECT_EQ((*TKeptLibrary<TFunctions>::Get())->fNumber(), 2);
  TFunctions::gName = SMALL_FIRST;
  EXPECT_EQ((*TKeptLibrary<TFunctions>::Get())->fNumber(), 2) << "the library that was opened first";
  EXPECT_TRUE(TSharedLibrary(::dlopen(SMALL_SECOND, RTLD_NOW | RTLD_NOLOAD)));
}

TEST(TKeptLibraryTest, ThreadsGetTheSameLibrary) {
  using TFunctions = TNumberFunctions<2>;
  TFunctions::gName = SMALL_FIRST;
  std::vector<void const*> libraries(8);
  std::vector<std::thread> threads;
  for (void const*& library : libraries) threads.emplace_back([&library] { library = TKeptLibrary<TFunctions>::Get().get(); });
  for (std::thread& thread : threads) thread.join();
  EXPECT_EQ(std::set<void const*>(libraries.begin(), libraries.end()).size(), 1u);
}

}  // namespace
}  // namespace NQRVZEP20
