// SPDX-License-Identifier: Apache-2.0
#include "providers/controller/ControllerParts.h"

#include "tests/providers/controller/FakeController.h"

#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

class ControllerPartsTest : public testing::Test {
protected:
  void AddLan(int channel) { fController.fAnswers[Bytes({6, 0x42, channel})] = Bytes({0, channel, 4, 1, 0, 0, 0, 0, 0, 0}); }

  TFinding<std::vector<TUserAccount>> Users() {
    TIpmi const ipmi = fController.Connection();
    return ReadUsers(ipmi, ReadLanChannels(ipmi));
  }

  TSensorState Sensor(std::string const& answer) {
    fController.fAnswers[Bytes({4, 0x2D, 0x30})] = answer;
    return ReadSensor(fController.Connection(), *SdrRecordFrom(FullSensorRecord(1, 0x30, "CPU Temp")).fSensor);
  }

  TFakeController fController;
};

TEST_F(ControllerPartsTest, RefusedQueriesAboutAllChannelsAreAReason) {
  auto const lans = ReadLanChannels(fController.Connection());
  ASSERT_FALSE(lans);
  EXPECT_EQ(lans.Why().fReason, "the controller refused the command 0x42 of network function 0x06 (completion code 0xc1)");
}

TEST_F(ControllerPartsTest, ChannelsThatDoNotExistAreSkipped) {
  AddLan(2);
  auto const lans = ReadLanChannels(fController.Connection());
  ASSERT_TRUE(lans);
  ASSERT_EQ(lans->size(), 1U);
  EXPECT_EQ(lans->front().fNumber, 2);
}

TEST_F(ControllerPartsTest, ARefusedQueryAboutTheFirstAccountIsAReason) {
  AddLan(1);
  fController.fAnswers[Bytes({6, 0x44, 1, 1})] = Bytes({0xD4});
  auto const users = Users();
  ASSERT_FALSE(users);
  EXPECT_EQ(users.Why().fReason, "the controller refused the command 0x44 of network function 0x06 (completion code 0xd4)");
}

TEST_F(ControllerPartsTest, ARefusedQueryAboutALaterAccountLeavesTheOthers) {
  AddLan(1);
  fController.fAnswers[Bytes({6, 0x44, 1, 1})] = Bytes({0, 3, 0x42, 0, 0x14});
  fController.fAnswers[Bytes({6, 0x44, 1, 3})] = Bytes({0, 3, 0x42, 0, 0x13});
  auto const users = Users();
  ASSERT_TRUE(users);
  ASSERT_EQ(users->size(), 2U);
  EXPECT_EQ(users->at(1).fNumber, 3);
}

TEST_F(ControllerPartsTest, AnAnswerWithoutAStateHasOnlyAReading) {
  TSensorState const state = Sensor(Bytes({0, 91, 0xC0}));
  EXPECT_EQ(*state.fRaw, 91);
  ASSERT_FALSE(state.fStates);
  EXPECT_EQ(state.fStates.Why().fReason, "the controller's answer has a reading, but no state");
  EXPECT_EQ(*Sensor(Bytes({0, 91, 0xC0, 0})).fStates, 0) << "normal";
}

TEST_F(ControllerPartsTest, AFruIsReadInShorterPartsIfTheControllerRefusesLongerOnes) {
  fController.fFru = FruDevice();
  for (int const code : {0xC7, 0xC8, 0xCA, 0xFF}) {
    SCOPED_TRACE(code);
    fController.fTooLong = code;
    for (std::size_t const longest : {8U, 16U, 31U}) {
      fController.fLongestPart = longest;
      auto const areas = ReadFru(fController.Connection(), 0);
      ASSERT_TRUE(areas) << longest;
      ASSERT_EQ(areas->size(), 3U);
      EXPECT_EQ(*areas->back().fSerialNumber, "KQ12345");
    }
  }
}

TEST_F(ControllerPartsTest, AFruThatIsRefusedInTheShortestPartsHasTheReason) {
  fController.fFru = FruDevice();
  fController.fLongestPart = 4;
  auto const areas = ReadFru(fController.Connection(), 0);
  ASSERT_FALSE(areas);
  EXPECT_EQ(areas.Why().fReason, "the controller refused the command 0x11 of network function 0x0a (completion code 0xca)");
}

}  // namespace
}  // namespace NQRVZEP20
