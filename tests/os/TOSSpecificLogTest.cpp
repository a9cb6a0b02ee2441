// SPDX-License-Identifier: Apache-2.0
#include "TOSSpecific.h"

#include "TLogger.h"
#include "tests/LogOf.h"
#include "tests/SmbiosTables.h"
#include "tests/os/FakeClock.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <syslog.h>

#include <climits>
#include <cstdarg>
#include <cstdio>

using testing::ElementsAre;
using testing::IsEmpty;

// A stand-in for the system log, which records its calls. The library finds these before those of the C library.

namespace {

struct TCall {
  std::string fOperation, fText;
  int fOption, fValue;  // of openlog: option and facility; of syslog: 0 and priority

  bool operator==(TCall const& other) const {
    return fOperation == other.fOperation && fText == other.fText && fOption == other.fOption && fValue == other.fValue;
  }
};
std::ostream& operator<<(std::ostream& out, TCall const& call) {
  return out << call.fOperation << "(" << call.fText << ", " << call.fOption << ", " << call.fValue << ")";
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
    int fSeverity, fPriority;
  } const rows[] = {{0, LOG_ERR},    {1, LOG_WARNING}, {2, LOG_NOTICE},   {3, LOG_NOTICE},
                    {4, LOG_NOTICE}, {-1, LOG_NOTICE}, {100, LOG_NOTICE}, {7, LOG_NOTICE}};
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fSeverity);
    gCalls.clear();
    TOSSpecific::LogSELEvent("text", Severity(row.fSeverity), 1);
    EXPECT_THAT(gCalls, ElementsAre(kOpened, TCall{"syslog", "text", 0, row.fPriority}, kClosed));
  }
}

TEST_F(TOSSpecificLogTest, LogSELEventDoesNotReadTheTextAsAFormat) {
  TOSSpecific::LogSELEvent("100%s %n", ILogger::kLogError, 1);
  EXPECT_EQ(gFormat, "%s");
  EXPECT_EQ(gCalls.at(1).fText, "100%s %n");
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

TEST_F(TOSSpecificLogTest, SysLogEntryPassesTheCompleteLineWithItsNewline) {
  struct {
    int fSeverity, fPriority;
    char const* fLine;
  } const rows[] = {
      {0, LOG_ERR, "FDR_[Error] 3/3/2024  9:5:7 Collecting inventory\n"},
      {1, LOG_WARNING, "FDR_[Warning] 3/3/2024  9:5:7 Collecting inventory\n"},
      {2, LOG_NOTICE, "FDR_[Status] 3/3/2024  9:5:7 Collecting inventory\n"},
      {3, LOG_NOTICE, "FDR_[Debug] 3/3/2024  9:5:7 Collecting inventory\n"},
      {4, LOG_NOTICE, "FDR_[Verbose] 3/3/2024  9:5:7 Collecting inventory\n"},
  };
  TFakeClock const clock({{2024, 3, 3, 9, 5, 7}});
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fLine);
    gCalls.clear();
    TLogger().SysLogEntry(Severity(row.fSeverity), "Collecting inventory");
    EXPECT_THAT(gCalls, ElementsAre(kOpened, TCall{"syslog", row.fLine, 0, row.fPriority}, kClosed));
  }
}

TEST_F(TOSSpecificLogTest, SysLogEntryIgnoresTheThresholdAndRecordsNothing) {
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

// ---- SetDebugLevel ----

class SetDebugLevelTest : public testing::Test {
protected:
  SetDebugLevelTest() : fDirectory(std::filesystem::current_path()) { std::filesystem::current_path(fDir.Path()); }
  ~SetDebugLevelTest() override {
    std::filesystem::current_path(fDirectory);
    TLogger::SetLogThreshold(ILogger::kLogStatus);
  }

  void UseTable(std::string const& table) {
    WriteFile(fDir.Path("table"), table);
    ::setenv("ZEP_SMBIOS_TABLE", fDir.Path("table").c_str(), 1);
  }

  bool SetDebugLevel(int level, std::string path) { return TOSSpecific::SetDebugLevel(level, path.data()); }

  static ILogger::EZEPLogSeverity Threshold() { return TLogger::GetInstance()->GetLogThreshold(); }

  TTempDir fDir;
  std::filesystem::path const fDirectory;
  TEnvironmentGuard const fTable{"ZEP_SMBIOS_TABLE", "/nonexistent"}, fZone{"TZ", "UTC0"};
};

std::vector<TFakeClock::TTime> const k3March2024 = {{2024, 3, 3, 9, 5, 7}};

TEST_F(SetDebugLevelTest, MakesAFileNamedByTypeAndTime) {
  TFakeClock const clock(k3March2024);
  UseTable(RealTable("full"));
  EXPECT_TRUE(SetDebugLevel(2, fDir.Path("zep_")));
  EXPECT_TRUE(std::filesystem::exists(fDir.Path("zep_123420240303-090507.log")));
  EXPECT_EQ(std::filesystem::file_size(fDir.Path("zep_123420240303-090507.log")), 0u);
}

TEST_F(SetDebugLevelTest, TheTimeIsLocal) {
  TFakeClock const clock(k3March2024);
  ::setenv("TZ", "XST+10", 1);
  SetDebugLevel(2, "zep_");
  EXPECT_TRUE(std::filesystem::exists("zep_000020240302-230507.log"));
}

TEST_F(SetDebugLevelTest, AnExistingFileIsTruncated) {
  TFakeClock const clock(k3March2024);
  WriteFile("a000020240303-090507.log", "earlier");
  SetDebugLevel(2, "a");
  EXPECT_EQ(ReadFile("a000020240303-090507.log"), "");
}

TEST_F(SetDebugLevelTest, AnEmptyPathLeadsToTheWorkingDirectory) {
  TFakeClock const clock(k3March2024);
  SetDebugLevel(2, "");
  EXPECT_TRUE(std::filesystem::exists("000020240303-090507.log"));
}

TEST_F(SetDebugLevelTest, OnlyTheLevels0To4AreSet) {
  struct TRow {
    int fLevel;
    bool fResult;
  };
  TRow const rows[] = {{0, true},   {1, true},   {2, true},    {3, true},    {4, true},          {5, false},
                       {-1, false}, {99, false}, {100, false}, {101, false}, {2147483647, false}};
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fLevel);
    TTempDir const dir;
    TLogger::SetLogThreshold(ILogger::kLogMemoryOnly);
    EXPECT_EQ(SetDebugLevel(row.fLevel, dir.Path("x")), row.fResult);
    EXPECT_EQ(Threshold(), row.fResult ? row.fLevel : static_cast<int>(ILogger::kLogMemoryOnly));
    EXPECT_FALSE(std::filesystem::is_empty(dir.Path())) << "the file is made whatever the level is";
  }
}

TEST_F(SetDebugLevelTest, AFileThatCannotBeMadeIsNotReported) {
  EXPECT_TRUE(SetDebugLevel(1, fDir.Path("absent/zep_")));
  EXPECT_EQ(Threshold(), ILogger::kLogWarning);
  EXPECT_FALSE(SetDebugLevel(7, fDir.Path("absent/zep_")));
}

TEST_F(SetDebugLevelTest, ThePathIsCutOffAfter255Bytes) {
  TFakeClock const clock(k3March2024);
  std::string const room = fDir.Path("");  // with its separator
  SetDebugLevel(2, room + std::string(255 - room.size(), 'x') + "yyy");
  EXPECT_TRUE(std::filesystem::exists(room + std::string(255 - room.size(), 'x')));
  SetDebugLevel(2, room + std::string(250 - room.size(), 'z'));
  EXPECT_TRUE(std::filesystem::exists(room + std::string(250 - room.size(), 'z') + "00002"));
  std::string long_(100000, 'l');
  EXPECT_TRUE(SetDebugLevel(2, long_)) << "such a name cannot be made";
}

TEST_F(SetDebugLevelTest, ReadsTheMachineTypeBeforeTheThresholdChanges) {
  UseTable(RealTable("full"));
  EXPECT_THAT(LogOf([&] { SetDebugLevel(0, fDir.Path("zep_")); }),
              ElementsAre("[Debug] getMachineType() entered.", "[Debug] Machine type detected: 1234",
                          "[Debug] getMachineType() completed."));
}

TEST_F(SetDebugLevelTest, AGivenPathIsUsedInBothVariants) {
  TFakeClock const clock(k3March2024);
  std::filesystem::create_directory("docs");
  WriteFile("docs/oem_zep_preboot_readme.txt", "");
  EXPECT_TRUE(SetDebugLevel(2, fDir.Path("zep_")));
  EXPECT_TRUE(std::filesystem::exists(fDir.Path("zep_000020240303-090507.log")));
}

// Without a path, the file is created in a system directory. The tests do not write there; they use a private directory.
TEST_F(SetDebugLevelTest, WithoutAPathTheVariantNamesTheDirectory) {
  NEEDS(::geteuid() == 0, "root, for a mount namespace");
  for (bool isOEM : {false, true}) {
    SCOPED_TRACE(isOEM);
    std::string const program = fDir.Path("in-namespace");
    std::string const made = fDir.Path(isOEM ? "made-oem" : "made");
    if (isOEM) {
      std::filesystem::create_directory("docs");
      WriteFile("docs/oem_zep_preboot_readme.txt", "");
    }
    WriteFile(program, "mount -t tmpfs none /var/log && mkdir /var/log/QRV_Support /var/log/OEM_Support && " ZEP_DEBUG_SESSION
                       " && ls /var/log/QRV_Support /var/log/OEM_Support > " +
                           made);
    ASSERT_EQ(std::system(("unshare --mount sh " + program).c_str()), 0);
    std::string const listed = ReadFile(made);
    std::string const heading = isOEM ? "/var/log/OEM_Support:\n" : "/var/log/QRV_Support:\n";
    EXPECT_THAT(listed, testing::HasSubstr(heading + "zep_0000"));
    EXPECT_THAT(listed, testing::ContainsRegex("zep_0000[0-9]{8}-[0-9]{6}\\.log\n"));
  }
}

}  // namespace
}  // namespace NQRVZEP20
