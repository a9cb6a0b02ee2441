// SPDX-License-Identifier: Apache-2.0
#include "collect/process/LogLines.h"

#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

constexpr char const* kLog =
    "-- ZEP Log Opened ----------------------------\n"
    "FDR_[Status] 3/3/2024  9:5:7 Collecting inventory\n"
    "FDR_[Error] 13/12/2024  19:15:17 no disk\nsecond line\n"
    "FDR_[Other] 3/3/2024  9:5:7 third line\n"
    "FDR_[Debug] 3/3/2024  9:5:7 \n";

TEST(LogLinesTest, EachEntryHasItsSeverityAndMessage) {
  auto const lines = LogLinesOf(kLog);
  ASSERT_EQ(lines.size(), 3u);
  EXPECT_EQ(lines[0].fSeverity, ILogger::kLogStatus);
  EXPECT_EQ(lines[0].fMessage, "Collecting inventory");
  EXPECT_EQ(lines[1].fSeverity, ILogger::kLogError);
  EXPECT_EQ(lines[1].fMessage, "no disk\nsecond line\nFDR_[Other] 3/3/2024  9:5:7 third line");
  EXPECT_EQ(lines[2].fSeverity, ILogger::kLogDebug);
  EXPECT_EQ(lines[2].fMessage, "");
}

TEST(LogLinesTest, TheLastLineIsThatOfTheLastEntry) {
  EXPECT_EQ(LastLogLineOf(kLog), "[Debug] ");
  EXPECT_EQ(LastLogLineOf("FDR_[Error] 3/3/2024  9:5:7 no disk\nsecond line\n"), "[Error] no disk");
  EXPECT_EQ(LastLogLineOf("no entry\n"), "");
  EXPECT_EQ(LastLogLineOf(""), "");
}

TEST(LogLinesTest, TheLastLineIsCutAndSearchedNearTheEnd) {
  std::string const entry = "FDR_[Error] 3/3/2024  9:5:7 ";
  EXPECT_EQ(LastLogLineOf(entry + std::string(5000, 'x')), "[Error] " + std::string(1013, 'x') + "...");
  EXPECT_EQ(LastLogLineOf(std::string(100'000, '\n') + entry + "no disk\n"), "[Error] no disk");
  EXPECT_EQ(LastLogLineOf(entry + "no disk\n" + std::string(100'000, '\n')), "");
}

TEST(LogLinesTest, ALongLogLosesItsMiddle) {
  std::string log = "first";
  AddToLog(log, " and last", 40);
  EXPECT_EQ(log, "first and last");
  for (int n = 0; n < 100; ++n) AddToLog(log, "0123456789", 40);
  EXPECT_LE(log.size(), 60u);
  EXPECT_EQ(log.substr(0, 20), "first and last012345");
  EXPECT_EQ(log.substr(log.size() - 20), "01234567890123456789");
}

}  // namespace
}  // namespace NQRVZEP20
