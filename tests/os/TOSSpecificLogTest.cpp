// SPDX-License-Identifier: Apache-2.0
#include "TOSSpecific.h"

#include "TLogger.h"
#include "tests/Support.h"
#include "tests/os/FakeClock.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <syslog.h>

#include <climits>
#include <cstdarg>
#include <cstdio>

using testing::ElementsAre;
using testing::IsEmpty;

// A stand-in for the system log, which writes down what is called. The library finds these before those of the C library.

namespace {

struct TCall {
  std::string operation, text;
  int option, value;  // of openlog: option and facility; of syslog: 0 and priority

  bool operator==(TCall const& other) const {
    return operation == other.operation && text == other.text && option == other.option && value == other.value;
  }
};
std::ostream& operator<<(std::ostream& out, TCall const& call) {
  return out << call.operation << "(" << call.text << ", " << call.option << ", " << call.value << ")";
}

std::vector<TCall> gCalls;
std::string gFormat;

}  // namespace

ZEP_EXPORT void openlog(char const* identity, int option, int facility) {
  gCalls.push_back({"openlog", identity, option, facility});
}

ZEP_EXPORT void syslog(int priority, char const* format, ...) {
  gFormat = format;
  va_list arguments;
  va_start(arguments, format);
  char text[4096];
  std::vsnprintf(text, sizeof text, format, arguments);
  va_end(arguments);
  gCalls.push_back({"syslog", text, 0, priority});
}

ZEP_EXPORT void closelog() { gCalls.push_back({"closelog", "", 0, 0}); }

namespace NQRVZEP20 {
namespace {

TCall const kOpened{"openlog", "YBNQ", LOG_NDELAY, LOG_SYSLOG};
TCall const kClosed{"closelog", "", 0, 0};

class TOSSpecificLogTest : public testing::Test {
protected:
  TOSSpecificLogTest() {
    gCalls.clear();
    TLogger().ClearLog();
  }
  ~TOSSpecificLogTest() override {
    TLogger::SetLogThreshold(ILogger::kLogStatus);
    TLogger().ClearLog();
  }
};

ILogger::EZEPLogSeverity Severity(int value) { return static_cast<ILogger::EZEPLogSeverity>(value); }

TEST_F(TOSSpecificLogTest, LogSELEventOpensLogsAndClosesWithThePriorityOfTheSeverity) {
  struct {
    int severity, priority;
  } const rows[] = {{0, LOG_ERR},    {1, LOG_WARNING}, {2, LOG_NOTICE},   {3, LOG_NOTICE},
                    {4, LOG_NOTICE}, {-1, LOG_NOTICE}, {100, LOG_NOTICE}, {7, LOG_NOTICE}};
  for (auto const& row : rows) {
    SCOPED_TRACE(row.severity);
    gCalls.clear();
    TOSSpecific::LogSELEvent("text", Severity(row.severity), 1);
    EXPECT_THAT(gCalls, ElementsAre(kOpened, TCall{"syslog", "text", 0, row.priority}, kClosed));
  }
}

TEST_F(TOSSpecificLogTest, LogSELEventDoesNotReadTheTextAsAFormat) {
  TOSSpecific::LogSELEvent("100%s %n", ILogger::kLogError, 1);
  EXPECT_EQ(gFormat, "%s");
  EXPECT_EQ(gCalls.at(1).text, "100%s %n");
}

TEST_F(TOSSpecificLogTest, LogSELEventDoesNotUseItsLastArgument) {
  for (int unused : {0, 1, -1, INT_MAX}) TOSSpecific::LogSELEvent("text", ILogger::kLogWarning, unused);
  ASSERT_EQ(gCalls.size(), 12u);
  for (std::size_t call = 0; call < gCalls.size(); call += 3) {
    EXPECT_EQ(gCalls[call], kOpened);
    EXPECT_EQ(gCalls[call + 1], (TCall{"syslog", "text", 0, LOG_WARNING}));
    EXPECT_EQ(gCalls[call + 2], kClosed);
  }
}

TEST_F(TOSSpecificLogTest, SysLogEntryPassesTheWholeLineWithItsNewline) {
  struct {
    int severity, priority;
    char const* line;
  } const rows[] = {
      {0, LOG_ERR, "FDR_[Error] 3/3/2024  9:5:7 Collecting inventory\n"},
      {1, LOG_WARNING, "FDR_[Warning] 3/3/2024  9:5:7 Collecting inventory\n"},
      {2, LOG_NOTICE, "FDR_[Status] 3/3/2024  9:5:7 Collecting inventory\n"},
      {3, LOG_NOTICE, "FDR_[Debug] 3/3/2024  9:5:7 Collecting inventory\n"},
      {4, LOG_NOTICE, "FDR_[Verbose] 3/3/2024  9:5:7 Collecting inventory\n"},
  };
  TFakeClock const clock({{2024, 3, 3, 9, 5, 7}});
  for (auto const& row : rows) {
    SCOPED_TRACE(row.line);
    gCalls.clear();
    TLogger().SysLogEntry(Severity(row.severity), "Collecting inventory");
    EXPECT_THAT(gCalls, ElementsAre(kOpened, TCall{"syslog", row.line, 0, row.priority}, kClosed));
  }
}

TEST_F(TOSSpecificLogTest, SysLogEntryAsksForNoThresholdAndRecordsNothing) {
  TLogger::SetLogThreshold(Severity(-1));
  for (int severity : {0, 1, 2, 3, 4}) TLogger().SysLogEntry(Severity(severity), "text");
  EXPECT_EQ(gCalls.size(), 15u);
  EXPECT_THAT(LoggedMessages(), IsEmpty());
}

TEST_F(TOSSpecificLogTest, SysLogEntryWritesNothingToTheFile) {
  TTempDir const dir;
  TLogger logger;
  logger.SetLogFilename(dir.Path("a.log"));
  logger.SysLogEntry(ILogger::kLogError, "text");
  EXPECT_EQ(ReadFile(dir.Path("a.log")), "-- ZEP Log Opened ----------------------------\n");
}

TEST_F(TOSSpecificLogTest, SysLogEntryRefusesAnUnknownSeverityBeforeItBuildsTheLine) {
  for (int severity : {-1, 5, 7, 99, 100, 101, 102, INT_MIN, INT_MAX}) {
    SCOPED_TRACE(severity);
    EXPECT_STATUS(TLogger().SysLogEntry(Severity(severity), "text"), kZEPStatusFail);
  }
  EXPECT_THAT(gCalls, IsEmpty());
}

TEST_F(TOSSpecificLogTest, DebugOutLogsItsTextAtDebug) {
  OnNewThread([] {
    TLogCapture const log;
    TOSSpecific::DebugOut("probe");
    TOSSpecific::DebugOut("");
    EXPECT_THAT(log.Entries(), ElementsAre("[Debug] TOSSpecific debug output: probe", "[Debug] TOSSpecific debug output: "));
  });
  EXPECT_THAT(LoggedMessages(), IsEmpty());
}

TEST_F(TOSSpecificLogTest, DebugOutIsFilteredAtTheDefaultThreshold) {
  TTempDir const dir;
  OnNewThread([&dir] {
    TLogger::GetInstance()->SetLogFilename(dir.Path("a.log"));
    TOSSpecific::DebugOut("probe");
    EXPECT_EQ(ReadFile(dir.Path("a.log")), "-- ZEP Log Opened ----------------------------\n");
  });
}

TEST_F(TOSSpecificLogTest, OutputLogStringPrintsNothing) {
  testing::internal::CaptureStdout();
  testing::internal::CaptureStderr();
  TOSSpecific::OutputLogString("FDR_[Status] 3/3/2024  9:5:7 probe\n");
  EXPECT_EQ(testing::internal::GetCapturedStdout(), "");
  EXPECT_EQ(testing::internal::GetCapturedStderr(), "");
  EXPECT_THAT(gCalls, IsEmpty());
}

}  // namespace
}  // namespace NQRVZEP20
