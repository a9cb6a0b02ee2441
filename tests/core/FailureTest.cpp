// SPDX-License-Identifier: Apache-2.0
#include "core/Failure.h"

#include "tests/LogOf.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

using testing::ElementsAre;

TEST(FailureTest, LogsOneLineAndThrowsThePartThatIsTheReason) {
  auto const fail = [] { LogErrorAndThrow(kZEPStatusNotFound, "Couldn't load NSP: Fan (", "no such file", ")"); };
  EXPECT_THAT(LogOf([&] { EXPECT_EQ(ReasonOf(fail), "no such file"); }),
              ElementsAre("[Error] Couldn't load NSP: Fan (no such file)"));
  EXPECT_THAT(LogOf([&] { EXPECT_STATUS(fail(), kZEPStatusNotFound); }), testing::SizeIs(1));
}

TEST(FailureTest, LineHasTheGivenSeverity) {
  std::pair<ILogger::EZEPLogSeverity, char const*> const rows[] = {
      {ILogger::kLogError, "[Error] a b"}, {ILogger::kLogStatus, "[Status] a b"}, {ILogger::kLogDebug, "[Debug] a b"}};
  for (auto const& [severity, line] : rows) {
    auto const fail = [severity = severity] { LogAndThrow(severity, kZEPStatusFail, "a ", "b"); };
    EXPECT_THAT(LogOf([&] { EXPECT_EQ(ReasonOf(fail), "b"); }), ElementsAre(line));
  }
}

TEST(FailureTest, LineThatIsFilteredLeavesTheReason) {
  OnNewThread([] {
    TRootObject::GetCoreLogger()->ClearLog();
    EXPECT_EQ(ReasonOf([] { LogAndThrow(ILogger::kLogDebug, kZEPStatusFail, "a ", "b"); }), "b");
    EXPECT_THAT(LoggedMessages(), testing::IsEmpty());
  });
}

}  // namespace
}  // namespace NQRVZEP20
