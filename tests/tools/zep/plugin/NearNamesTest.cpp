// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/plugin/NearNames.h"

#include <gmock/gmock.h>

namespace NQRVZEP20::zep {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

std::vector<std::string> const kNames = {"CIM_Disk", "CIM_DiskDrive", "CIM_DVDDrive", "CIM_Fan", "CIM_TapeDrive", "X_Disk"};

TEST(NearNamesTest, AMisspeltNameIsFound) {
  EXPECT_THAT(NearNames("CIM_DskDrive", kNames), ElementsAre("CIM_DiskDrive", "CIM_DVDDrive"));
  EXPECT_THAT(NearNames("cim_fans", kNames), ElementsAre("CIM_Fan"));
}

TEST(NearNamesTest, ANameWithoutItsBeginningIsFound) {
  EXPECT_THAT(NearNames("diskdrive", kNames), ElementsAre("CIM_DiskDrive"));
}

TEST(NearNamesTest, AnUnlikeNameIsNotFound) {
  EXPECT_THAT(NearNames("CIM_Processor", kNames), IsEmpty());
  EXPECT_THAT(NearNames("CIM_Fan", {}), IsEmpty());
}

TEST(NearNamesTest, AtMostFiveAreNamed) {
  EXPECT_THAT(NearNames("x", {"x1", "x2", "x3", "x4", "x5", "x6"}), ElementsAre("x1", "x2", "x3", "x4", "x5"));
}

}  // namespace
}  // namespace NQRVZEP20::zep
