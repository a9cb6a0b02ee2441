// SPDX-License-Identifier: Apache-2.0
#include "core/Log.h"

#include "TLogger.h"
#include "TRootObject.h"
#include "tests/Support.h"
#include "tests/core/Allocations.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <climits>
#include <cstdint>
#include <optional>

namespace NQRVZEP20 {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

std::optional<ILogger*> gCoreLogger;  // returned instead of the thread's logger when set

}  // namespace

// Replaces the library's function in this program.
ILogger* TRootObject::GetCoreLogger() { return gCoreLogger ? *gCoreLogger : TLogger::GetInstance(); }

namespace {

class TRecordingLogger : public ILogger {
public:
  void OutputLogEntry(EZEPLogSeverity severity, std::string const& message) override {
    fEntries.push_back(std::to_string(severity) + " " + message);
  }
  void SysLogEntry(EZEPLogSeverity, std::string const&) override { ADD_FAILURE() << "the door does not use the system log"; }
  std::list<TLogEntry>& GetLog() override { return fNoEntries; }
  void ClearLog() override { ADD_FAILURE() << "the door does not clear the log"; }
  EZEPLogSeverity GetLogThreshold() override { return fThreshold; }
  void SetLogFilename(std::string) override { ADD_FAILURE() << "the door does not open files"; }

  std::vector<std::string> fEntries;
  EZEPLogSeverity fThreshold = kLogStatus;

private:
  std::list<TLogEntry> fNoEntries;
};

class LogTest : public testing::Test {
protected:
  LogTest() { gCoreLogger = &fLogger; }
  ~LogTest() override { gCoreLogger.reset(); }

  TRecordingLogger fLogger;
};

ILogger::EZEPLogSeverity Severity(int value) { return static_cast<ILogger::EZEPLogSeverity>(value); }

TEST_F(LogTest, EntriesUpToTheThresholdAndMemoryOnlyEntriesPass) {
  for (int threshold : {-1, 0, 1, 2, 3, 4, 10, 1000}) {
    for (int severity : {INT_MIN, -1, 0, 1, 2, 3, 4, 5, 10, 99, 100, 101, 102, INT_MAX}) {
      SCOPED_TRACE(testing::Message() << "severity " << severity << ", threshold " << threshold);
      fLogger.fThreshold = Severity(threshold);
      fLogger.fEntries.clear();
      bool const passes = severity <= threshold || severity == 100 || severity == 101;
      EXPECT_EQ(IsLogged(Severity(severity)), passes);
      Log(Severity(severity), "probe");
      EXPECT_EQ(fLogger.fEntries.size(), passes ? 1u : 0u);
    }
  }
}

TEST_F(LogTest, EachFunctionLogsAtItsSeverity) {
  fLogger.fThreshold = ILogger::kLogVerbose;
  LogError("of an error");
  LogStatus("of a status");
  LogDebug("of a debug entry");
  Log(ILogger::kLogWarning, "of a warning");
  Log(ILogger::kLogVerbose, "of a verbose entry");
  EXPECT_THAT(fLogger.fEntries,
              ElementsAre("0 of an error", "2 of a status", "3 of a debug entry", "1 of a warning", "4 of a verbose entry"));
}

TEST_F(LogTest, ThePiecesOfAMessageAreJoined) {
  std::string const key = "proxy", withZero("a\0b", 3);
  char const* const value = "on";
  LogError("key ", key, " found, value is ", std::string_view("off and on").substr(8), " or ", value);
  LogError(withZero);
  LogError("");
  LogError();
  EXPECT_THAT(fLogger.fEntries, ElementsAre("0 key proxy found, value is on or on", std::string("0 a\0b", 5), "0 ", "0 "));
}

TEST_F(LogTest, NumbersAreDecimal) {
  LogError(0, ",", -7, ",", 255u, ",", INT64_MIN, ",", UINT64_MAX, ",", static_cast<short>(-32768), ",",
           static_cast<unsigned char>(200));
  EXPECT_THAT(fLogger.fEntries, ElementsAre("0 0,-7,255,-9223372036854775808,18446744073709551615,-32768,200"));
}

TEST_F(LogTest, WithoutALoggerNothingIsLogged) {
  gCoreLogger = nullptr;
  EXPECT_FALSE(IsLogged(ILogger::kLogError));
  EXPECT_FALSE(IsLogged(ILogger::kLogMemoryOnly));
  LogError("probe ", 1);
  WriteLogEntry(ILogger::kLogError, "probe");
  EXPECT_THAT(fLogger.fEntries, IsEmpty());
}

TEST_F(LogTest, AFilteredEntryAllocatesNothing) {
  if (!CountsAllocations()) GTEST_SKIP() << "allocations are not counted under the thread sanitizer";
  std::string const longText(1000, 'x');
  long const before = CountedAllocations();
  LogDebug("a message that does not fit into a string without an allocation: ", longText, " ", 1234567890123456789);
  Log(ILogger::kLogVerbose, longText, longText);
  EXPECT_EQ(CountedAllocations(), before);

  LogStatus("a message that does not fit into a string without an allocation: ", longText);
  EXPECT_GT(CountedAllocations(), before);
}

TEST_F(LogTest, TheThreadsLoggerFiltersWithoutAllocating) {
  if (!CountsAllocations()) GTEST_SKIP() << "allocations are not counted under the thread sanitizer";
  gCoreLogger.reset();
  std::string const longText(1000, 'x');
  TLogger::GetInstance();
  long const before = CountedAllocations();
  TRootObject::GetCoreLogger()->OutputLogEntry(ILogger::kLogDebug, longText);
  TLogger::GetInstance()->OutputLogEntry(ILogger::kLogVerbose, longText);
  LogDebug("probe: ", longText);
  EXPECT_EQ(CountedAllocations(), before);

  TRootObject::GetCoreLogger()->OutputLogEntry(ILogger::kLogStatus, longText);
  EXPECT_GT(CountedAllocations(), before);
  TLogger::GetInstance()->ClearLog();
}

TEST_F(LogTest, EntriesGoToTheThreadsLogger) {
  gCoreLogger.reset();
  OnNewThread([] {
    TLogCapture const log;
    LogDebug("probe ", 1);
    EXPECT_THAT(log.Entries(), ElementsAre("[Debug] probe 1"));
  });
}

}  // namespace
}  // namespace NQRVZEP20
