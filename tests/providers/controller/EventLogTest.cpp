// SPDX-License-Identifier: Apache-2.0
#include "providers/controller/EventLog.h"

#include "tests/providers/controller/FakeController.h"

#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

class EventLogTest : public testing::Test {
protected:
  EventLogTest() { fController.fEvents = {SelEvent(0, 1, 0x30, 1, 9), SelEvent(1, 8, 0x51, 0x6F, 1)}; }

  TFinding<TEventLog> Read() {
    return ReadEventLog(fController.Connection(), [](char const*, std::size_t, std::size_t) {});
  }

  TFakeController fController;
};

TEST_F(EventLogTest, EveryEntryIsRead) {
  auto const log = Read();
  ASSERT_TRUE(log);
  EXPECT_EQ(log->fCount, 2);
  EXPECT_EQ(*log->fRoomFor, 100U);
  EXPECT_EQ(*log->fClock, 1612137600U);
  EXPECT_FALSE(log->fHasLostEntries);
  ASSERT_EQ(log->fEntries.size(), 2U);
  EXPECT_EQ(log->fEntries[0].fSensorNumber, 0x30);
  EXPECT_EQ(log->fEntries[1].fSensorType, 8);
  EXPECT_TRUE(log->fIsComplete);
}

TEST_F(EventLogTest, AFullLogAndAMissingClockAreReported) {
  fController.fFree = 0;
  fController.fHasLostEntries = true;
  fController.fHasClock = false;
  auto const log = Read();
  EXPECT_EQ(*log->fRoomFor, 0U);
  EXPECT_TRUE(log->fHasLostEntries);
  EXPECT_EQ(log->fClock.Why().fReason, "the clock of the controller is not set");
}

TEST_F(EventLogTest, EntriesBeforeAFailureAreKept) {
  fController.fMostRequests = 3;
  auto const log = Read();
  EXPECT_EQ(log->fEntries.size(), 1U);
  EXPECT_EQ(log->fIsComplete.Why().fReason, "the controller does not answer");
}

TEST_F(EventLogTest, ALogWithoutEndIsLeft) {
  fController.fRepeatsRecords = true;
  EXPECT_EQ(Read()->fIsComplete.Why().fReason, "the event log has no end");
}

TEST_F(EventLogTest, AControllerWithoutALogHasTheReason) {
  fController.fMostRequests = 0;
  EXPECT_EQ(Read().Why().fCode, kMissingNoAnswer);
}

}  // namespace
}  // namespace NQRVZEP20
