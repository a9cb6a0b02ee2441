// SPDX-License-Identifier: Apache-2.0
#include "loaders/IpmiLibrary.h"

#include "tests/ipmi/standin/LoadStandIn.h"

#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

// The stand-in library is kept for the process, so only the first test that runs in it finds its variant.

TEST(IpmiLibraryTest, TheCodeOfTheLibraryIsReturned) {
  TStandInIpmiClient& standIn = LoadStandInIpmiClient();
  for (int const code : {0, 1, 11, 15, -7}) {
    standIn.fOpenResult = code;
    TIpmiResult const result = OpenIpmiConnection("h", "u", "p");
    EXPECT_EQ(result.fLoad.fKind, TLoadOutcome::kComplete);
    EXPECT_EQ(result.fCode, code);
    EXPECT_EQ(static_cast<bool>(result), code == 0);
  }
}

TEST(IpmiLibraryTest, AMissingFunctionIsNamedAndTheOthersAreUsed) {
  LoadStandInIpmiClient("without-open");
  TIpmiResult const result = OpenIpmiConnection("h", "u", "p");
  EXPECT_FALSE(result);
  EXPECT_EQ(result.fLoad.fKind, TLoadOutcome::kFunctionMissing);
  EXPECT_EQ(result.fLoad.fReason, "the function OpenConnection is missing");
  EXPECT_TRUE(CloseIpmiConnection());
}

}  // namespace
}  // namespace NQRVZEP20
