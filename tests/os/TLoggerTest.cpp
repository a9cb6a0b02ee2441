// SPDX-License-Identifier: Apache-2.0
#include "TLogger.h"

#include "TOSSpecific.h"
#include "TRootObject.h"
#include "tests/Support.h"
#include "tests/os/FakeClock.h"
#include "tests/os/Programs.h"
#include "tests/os/Unprivileged.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <pthread.h>
#include <sys/stat.h>

#include <atomic>
#include <chrono>
#include <climits>
#include <cstring>
#include <ctime>

namespace NQRVZEP20 {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using testing::MatchesRegex;

std::string const kOpenBanner = "-- ZEP Log Opened ----------------------------\n";
std::string const kCloseBanner = "-- ZEP Log Closed ----------------------------\n";

ILogger::EZEPLogSeverity Severity(int value) { return static_cast<ILogger::EZEPLogSeverity>(value); }

// The number of this process's descriptors that refer to that file.
int DescriptorsOf(std::string const& path) {
  int count = 0;
  for (auto const& entry : std::filesystem::directory_iterator("/proc/self/fd")) {
    std::error_code gone;
    if (std::filesystem::read_symlink(entry, gone) == path) ++count;
  }
  return count;
}

class TLoggerTest : public testing::Test {
protected:
  TLoggerTest() { TLogger().ClearLog(); }
  ~TLoggerTest() override {
    TLogger::SetLogThreshold(ILogger::kLogStatus);
    TLogger::SetLogFileDir("/var/log/QRV_Support/ZepDebugLog/");
    TLogger().ClearLog();
  }

  std::string Path(std::string const& name) const { return fDir.Path(name); }

  // Returns the text that one entry writes to a new log file at that time, with a threshold that filters nothing.
  std::string WrittenAt(TFakeClock::TTime const& time, ILogger::EZEPLogSeverity severity, std::string const& message) {
    TFakeClock const clock({time});
    TLogger::SetLogThreshold(ILogger::kLogVerbose);
    TLogger logger;
    logger.SetLogFilename(Path("written"));
    logger.OutputLogEntry(severity, message);
    return ReadFile(Path("written")).substr(kOpenBanner.size());
  }

  TEnvironmentGuard fNoAppending{"QRV_YBNQI_GUI_T", nullptr};
  TTempDir fDir;
};

// ---- Instances ----

TEST_F(TLoggerTest, EveryThreadHasALoggerOfItsOwn) {
  TLogger* const here = TLogger::GetInstance();
  ASSERT_NE(here, nullptr);
  EXPECT_EQ(TLogger::GetInstance(), here);
  OnNewThread([here] {
    TLogger* const there = TLogger::GetInstance();
    EXPECT_NE(there, nullptr);
    EXPECT_NE(there, here);
    EXPECT_EQ(TLogger::GetInstance(), there);
  });
  EXPECT_EQ(TLogger::GetInstance(), here);
}

TEST_F(TLoggerTest, TheCoreLoggerIsTheThreadsLogger) {
  EXPECT_EQ(TRootObject::GetCoreLogger(), TLogger::GetInstance());
  OnNewThread([] { EXPECT_EQ(TRootObject::GetCoreLogger(), TLogger::GetInstance()); });
}

TEST_F(TLoggerTest, ANewLoggerRecordsAndWritesNothing) {
  OnNewThread([] { TLogger::GetInstance()->OutputLogEntry(ILogger::kLogStatus, "probe"); });
  EXPECT_THAT(LoggedMessages(), ElementsAre("probe"));
  EXPECT_TRUE(std::filesystem::is_empty(fDir.Path()));
}

TEST_F(TLoggerTest, StartsWithThresholdStatusAndTheProductsLogDirectory) {
  EXPECT_EQ(TLogger::GetInstance()->GetLogThreshold(), ILogger::kLogStatus);
  EXPECT_EQ(TLogger::GetLogFileDir(), "/var/log/QRV_Support/ZepDebugLog/");
}

TEST_F(TLoggerTest, ThresholdAndDirectoryTakeAnyValueAndHoldForAllThreads) {
  for (int threshold : {-5, 0, 3, 4, 10, 101}) {
    TLogger::SetLogThreshold(Severity(threshold));
    OnNewThread([threshold] { EXPECT_EQ(TLogger::GetInstance()->GetLogThreshold(), threshold); });
  }
  for (char const* directory : {"", "relative", "/x/"}) {
    TLogger::SetLogFileDir(directory);
    OnNewThread([directory] { EXPECT_EQ(TLogger::GetLogFileDir(), directory); });
  }
}

TEST_F(TLoggerTest, TheOperationsOfTheInterfaceKeepTheirSlots) {
  EXPECT_EQ(SlotOf(&ILogger::OutputLogEntry), 3u);
  EXPECT_EQ(SlotOf(&ILogger::SysLogEntry), 4u);
  EXPECT_EQ(SlotOf(&ILogger::GetLog), 5u);
  EXPECT_EQ(SlotOf(&ILogger::ClearLog), 6u);
  EXPECT_EQ(SlotOf(&ILogger::GetLogThreshold), 7u);
  EXPECT_EQ(SlotOf(&ILogger::SetLogFilename), 8u);
}

// ---- The end of a thread and of the process ----

TEST_F(TLoggerTest, TheFileIsClosedWithItsThread) {
  OnNewThread([this] {
    TLogger::GetInstance()->SetLogFilename(Path("a.log"));
    EXPECT_EQ(ReadFile(Path("a.log")), kOpenBanner);
  });
  EXPECT_EQ(ReadFile(Path("a.log")), kOpenBanner + kCloseBanner);
  EXPECT_EQ(DescriptorsOf(Path("a.log")), 0);
}

TEST_F(TLoggerTest, EveryThreadWritesToItsOwnFile) {
  TFakeClock const clock({{2024, 3, 3, 9, 5, 7}});
  std::thread first([this] {
    TLogger::GetInstance()->SetLogFilename(Path("first.log"));
    OnNewThread([this] {
      TLogger::GetInstance()->SetLogFilename(Path("second.log"));
      TLogger::GetInstance()->OutputLogEntry(ILogger::kLogStatus, "of the second");
    });
    OnNewThread([] { TLogger::GetInstance()->OutputLogEntry(ILogger::kLogStatus, "of the third"); });
    TLogger::GetInstance()->OutputLogEntry(ILogger::kLogStatus, "of the first");
  });
  first.join();
  EXPECT_EQ(ReadFile(Path("first.log")), kOpenBanner + "FDR_[Status] 3/3/2024  9:5:7 of the first\n" + kCloseBanner);
  EXPECT_EQ(ReadFile(Path("second.log")), kOpenBanner + "FDR_[Status] 3/3/2024  9:5:7 of the second\n" + kCloseBanner);
  EXPECT_THAT(LoggedMessages(), ElementsAre("of the second", "of the third", "of the first"));
}

TEST_F(TLoggerTest, ASecondThreadTruncatesTheFileOfTheSameName) {
  TLogger::SetLogFileDir(Path("logs/"));
  OnNewThread([this] {
    TLogger::GetInstance()->Initialize("same");
    TLogger::GetInstance()->OutputLogEntry(ILogger::kLogStatus, "lost");
    OnNewThread([] { TLogger::GetInstance()->Initialize("same"); });
    EXPECT_EQ(ReadFile(Path("logs/same.log")), kOpenBanner + kCloseBanner);
  });
}

TEST_F(TLoggerTest, TwoThreadsShareTheFileOfTheSameNameWhenAppending) {
  TEnvironmentGuard const appending("QRV_YBNQI_GUI_T", "1");
  TFakeClock const clock({{2024, 3, 3, 9, 5, 7}});
  OnNewThread([this] {
    TLogger::GetInstance()->SetLogFilename(Path("same.log"));
    OnNewThread([this] { TLogger::GetInstance()->SetLogFilename(Path("same.log")); });
    TLogger::GetInstance()->OutputLogEntry(ILogger::kLogStatus, "kept");
  });
  EXPECT_EQ(ReadFile(Path("same.log")),
            kOpenBanner + kOpenBanner + kCloseBanner + "FDR_[Status] 3/3/2024  9:5:7 kept\n" + kCloseBanner);
}

// Logs when it is destroyed, through a logger that must be there.
struct TLogsAtTheEnd {
  ~TLogsAtTheEnd() {
    EXPECT_NE(TLogger::GetInstance(), nullptr);
    EXPECT_EQ(TLogger::GetInstance(), TRootObject::GetCoreLogger());
    TRootObject::GetCoreLogger()->OutputLogEntry(ILogger::kLogStatus, "the end");
  }
  void Touch() {}
};

TEST_F(TLoggerTest, AThreadLocalObjectMayLogAtTheEndOfAThread) {
  TFakeClock const clock({{2024, 3, 3, 9, 5, 7}});
  OnNewThread([this] {
    thread_local TLogsAtTheEnd logsAtTheEnd;
    logsAtTheEnd.Touch();
    TLogger::GetInstance()->SetLogFilename(Path("a.log"));
  });
  EXPECT_EQ(ReadFile(Path("a.log")), kOpenBanner + "FDR_[Status] 3/3/2024  9:5:7 the end\n" + kCloseBanner);
}

TEST_F(TLoggerTest, ALogEntryAfterTheEndOfTheLoggerGetsANewOneWithoutAFile) {
  TLogger::GetInstance();  // the logger's own key is created first and therefore destroyed first
  pthread_key_t key;
  ASSERT_EQ(::pthread_key_create(&key, [](void*) { TLogsAtTheEnd(); }), 0);
  OnNewThread([this, key] {
    ::pthread_setspecific(key, this);
    TLogger::GetInstance()->SetLogFilename(Path("a.log"));
  });
  ::pthread_key_delete(key);
  EXPECT_EQ(ReadFile(Path("a.log")), kOpenBanner + kCloseBanner);
  EXPECT_THAT(LoggedMessages(), ElementsAre("the end"));
}

TEST_F(TLoggerTest, ObjectsMayLogAtTheEndOfTheProcess) {
  TProgramRun const run = RunProgram(BuildPath("tests/programs/LogAtTheEnd") + " " + Path("a.log"));
  EXPECT_EQ(run.fOutput, "a thread-local object\na static object\na registered provider\n");
  EXPECT_EQ(run.fExitCode, 0);
  EXPECT_THAT(ReadFile(Path("a.log")),
              MatchesRegex(kOpenBanner + "FDR_.Status. [/0-9]+  [:0-9]+ a thread-local object\n" + kCloseBanner));
}

// ---- Opening the file ----

TEST_F(TLoggerTest, BannersHave47Bytes) {
  { TLogger().SetLogFilename(Path("a.log")); }
  EXPECT_EQ(ReadFile(Path("a.log")),
            "-- ZEP Log Opened ----------------------------\n-- ZEP Log Closed ----------------------------\n");
  EXPECT_EQ(ReadFile(Path("a.log")).size(), 94u);
}

TEST_F(TLoggerTest, ALoggerWithoutAFileEndsQuietly) {
  { TLogger const logger; }
  EXPECT_TRUE(std::filesystem::is_empty(fDir.Path()));
}

TEST_F(TLoggerTest, TruncatesAnExistingFile) {
  WriteFile(Path("a.log"), "an earlier session\n");
  { TLogger().SetLogFilename(Path("a.log")); }
  EXPECT_EQ(ReadFile(Path("a.log")), kOpenBanner + kCloseBanner);
}

TEST_F(TLoggerTest, AppendsWhenTheEnvironmentVariableIsSetToAnything) {
  for (char const* value : {"1", "0", "no", ""}) {
    SCOPED_TRACE(value);
    TEnvironmentGuard const appending("QRV_YBNQI_GUI_T", value);
    WriteFile(Path("a.log"), "an earlier session\n");
    { TLogger().SetLogFilename(Path("a.log")); }
    EXPECT_EQ(ReadFile(Path("a.log")), "an earlier session\n" + kOpenBanner + kCloseBanner);
  }
}

TEST_F(TLoggerTest, AppendingMakesAMissingFile) {
  TEnvironmentGuard const appending("QRV_YBNQI_GUI_T", "1");
  { TLogger().SetLogFilename(Path("new.log")); }
  EXPECT_EQ(ReadFile(Path("new.log")), kOpenBanner + kCloseBanner);
}

mode_t ModeOf(std::string const& path) {
  struct stat status {};
  EXPECT_EQ(::stat(path.c_str(), &status), 0);
  return status.st_mode & 07777;
}

TEST_F(TLoggerTest, ANewFileIsReadableByItsOwnerOnlyWithAnyUmask) {
  for (char const* appending : {static_cast<char const*>(nullptr), "1"})
    for (mode_t const mask : {0, 022, 077, 0277, 0777}) {
      SCOPED_TRACE(mask);
      TEnvironmentGuard const setting("QRV_YBNQI_GUI_T", appending);
      std::string const path = Path(std::to_string(mask) + (appending ? "appending.log" : ".log"));
      mode_t const old = ::umask(mask);
      { TLogger().SetLogFilename(path); }
      ::umask(old);
      EXPECT_EQ(ModeOf(path), mode_t{0600});
      EXPECT_EQ(ReadFile(path), kOpenBanner + kCloseBanner);
    }
}

TEST_F(TLoggerTest, AFileThatInitializeMakesIsForItsOwnerAlone) {
  TLogger::SetLogFileDir(Path("logs/"));
  mode_t const old = ::umask(022);
  { TLogger().Initialize("zep"); }
  ::umask(old);
  EXPECT_EQ(ModeOf(Path("logs")), mode_t{0755});
  EXPECT_EQ(ModeOf(Path("logs/zep.log")), mode_t{0600});
}

TEST_F(TLoggerTest, AnExistingFileKeepsItsMode) {
  for (char const* appending : {static_cast<char const*>(nullptr), "1"}) {
    TEnvironmentGuard const setting("QRV_YBNQI_GUI_T", appending);
    WriteFile(Path("a.log"), "");
    std::filesystem::permissions(Path("a.log"), std::filesystem::perms(0640));
    { TLogger().SetLogFilename(Path("a.log")); }
    EXPECT_EQ(ModeOf(Path("a.log")), mode_t{0640});
  }
}

TEST_F(TLoggerTest, AFileThatItMakesThroughALinkIsForItsOwnerAlone) {
  std::filesystem::create_symlink("target.log", Path("link.log"));
  { TLogger().SetLogFilename(Path("link.log")); }
  EXPECT_EQ(ModeOf(Path("target.log")), mode_t{0600});
  EXPECT_EQ(ReadFile(Path("target.log")), kOpenBanner + kCloseBanner);
}

TEST_F(TLoggerTest, EachOpeningReadsTheEnvironment) {
  TLogger logger;
  logger.SetLogFilename(Path("a.log"));
  TEnvironmentGuard const appending("QRV_YBNQI_GUI_T", "1");
  logger.SetLogFilename(Path("a.log"));
  EXPECT_EQ(ReadFile(Path("a.log")), kOpenBanner + kOpenBanner);
}

TEST_F(TLoggerTest, AFileThatMayNotBeOpenedIsAccessDenied) {
  WriteFile(Path("a.log"), "");
  std::string const path = Path("a.log");
  for (char const* appending : {static_cast<char const*>(nullptr), "1"}) {
    TEnvironmentGuard const setting("QRV_YBNQI_GUI_T", appending);
    EXPECT_EQ(ThrownWhenUnprivileged([&] { TLogger().SetLogFilename(path); }), kZEPStatusAccessDenied);
  }
}

TEST_F(TLoggerTest, AFileThatCannotBeOpenedOtherwiseIsAFileSystemError) {
  WriteFile(Path("plain"), "");
  std::filesystem::create_symlink("loop", Path("loop"));
  for (std::string const& path :
       {std::string(), Path("missing/a.log"), Path("plain/a.log"), fDir.Path(), Path("loop"), Path(std::string(300, 'n'))}) {
    SCOPED_TRACE(path);
    TLogger logger;
    EXPECT_STATUS(logger.SetLogFilename(path), kZEPStatusFileSystemError);
  }
}

TEST_F(TLoggerTest, AfterAFailedOpeningEntriesAreStillRecorded) {
  TLogger logger;
  EXPECT_STATUS(logger.SetLogFilename(Path("missing/a.log")), kZEPStatusFileSystemError);
  for (int severity : {0, 1, 2}) logger.OutputLogEntry(Severity(severity), std::to_string(severity));
  EXPECT_THAT(LoggedMessages(), ElementsAre("0", "1", "2"));
}

TEST_F(TLoggerTest, AfterAFailedOpeningAnotherOneMaySucceed) {
  {
    TLogger logger;
    EXPECT_STATUS(logger.SetLogFilename(Path("missing/a.log")), kZEPStatusFileSystemError);
    logger.SetLogFilename(Path("a.log"));
  }
  EXPECT_EQ(ReadFile(Path("a.log")), kOpenBanner + kCloseBanner);
}

TEST_F(TLoggerTest, AFailedSecondOpeningLeavesTheLoggerWithoutAFile) {
  {
    TLogger logger;
    logger.SetLogFilename(Path("first.log"));
    EXPECT_STATUS(logger.SetLogFilename(Path("missing/a.log")), kZEPStatusFileSystemError);
    logger.OutputLogEntry(ILogger::kLogStatus, "not written");
  }
  EXPECT_EQ(ReadFile(Path("first.log")), kOpenBanner);
}

TEST_F(TLoggerTest, ASecondOpeningLeavesTheFirstStreamOpenAndUnused) {
  {
    TFakeClock const clock({{2024, 3, 3, 9, 5, 7}});
    TLogger logger;
    logger.SetLogFilename(Path("first.log"));
    logger.SetLogFilename(Path("second.log"));
    logger.OutputLogEntry(ILogger::kLogStatus, "probe");
    EXPECT_EQ(DescriptorsOf(Path("first.log")), 1);
    EXPECT_EQ(DescriptorsOf(Path("second.log")), 1);
  }
  EXPECT_EQ(ReadFile(Path("first.log")), kOpenBanner);
  EXPECT_EQ(ReadFile(Path("second.log")), kOpenBanner + "FDR_[Status] 3/3/2024  9:5:7 probe\n" + kCloseBanner);
  EXPECT_EQ(DescriptorsOf(Path("first.log")), 1);
  EXPECT_EQ(DescriptorsOf(Path("second.log")), 0);
}

// ---- Initialize ----

TEST_F(TLoggerTest, InitializeMakesTheDirectoryAndOpensTheNamedFile) {
  TLogger::SetLogFileDir(Path("a/b/c/"));
  TLogger logger;
  EXPECT_EQ(logger.Initialize("zep"), kZEPStatusOK);
  EXPECT_EQ(ReadFile(Path("a/b/c/zep.log")), kOpenBanner);
}

TEST_F(TLoggerTest, ThreadsMayInitializeAtOnceInANewDirectory) {
  constexpr int kRounds = 1200;
  std::atomic<int> failures{0};
  for (int round = 0; round < kRounds; ++round) {
    TLogger::SetLogFileDir(Path(std::to_string(round) + "/logs/"));
    std::atomic<int> ready{0};
    auto const initialize = [&](char const* name) {
      for (++ready; ready < 2;) std::this_thread::yield();
      try {
        TLogger::GetInstance()->Initialize(name);
      } catch (TZEPException const&) {
        ++failures;
      }
    };
    std::thread first(initialize, "first"), second(initialize, "second");
    first.join();
    second.join();
  }
  EXPECT_EQ(failures, 0);
}

TEST_F(TLoggerTest, InitializePutsNoSeparatorBetweenDirectoryAndName) {
  TLogger::SetLogFileDir(Path("a"));
  TLogger logger;
  logger.Initialize("zep");
  EXPECT_TRUE(std::filesystem::is_directory(Path("a")));
  EXPECT_EQ(ReadFile(Path("azep.log")), kOpenBanner);
}

TEST_F(TLoggerTest, InitializeAcceptsAnEmptyName) {
  TLogger::SetLogFileDir(Path("a/"));
  TLogger logger;
  logger.Initialize("");
  EXPECT_EQ(ReadFile(Path("a/.log")), kOpenBanner);
}

TEST_F(TLoggerTest, OnlyTheFirstInitializeDoesAnything) {
  TLogger::SetLogFileDir(Path("a/"));
  TLogger logger;
  logger.Initialize("first");
  TLogger::SetLogFileDir(Path("b/"));
  EXPECT_EQ(logger.Initialize("second"), kZEPStatusOK);
  EXPECT_FALSE(std::filesystem::exists(Path("b")));
  EXPECT_FALSE(std::filesystem::exists(Path("a/second.log")));
  logger.OutputLogEntry(ILogger::kLogStatus, "probe");
  EXPECT_GT(ReadFile(Path("a/first.log")).size(), kOpenBanner.size());
}

TEST_F(TLoggerTest, InitializeIsOncePerInstance) {
  TLogger::SetLogFileDir(Path("a/"));
  TLogger first, second;
  first.Initialize("first");
  second.Initialize("second");
  EXPECT_EQ(ReadFile(Path("a/second.log")), kOpenBanner);
}

TEST_F(TLoggerTest, SetLogFilenameDoesNotCountAsInitialize) {
  TLogger::SetLogFileDir(Path("a/"));
  TLogger logger;
  logger.SetLogFilename(Path("first.log"));
  logger.Initialize("second");
  EXPECT_EQ(ReadFile(Path("a/second.log")), kOpenBanner);
}

TEST_F(TLoggerTest, InitializeMayBeCalledAgainAfterTheDirectoryFailed) {
  TLogger::SetLogFileDir(Path("a/b/"));
  WriteFile(Path("a"), "a plain file in the way");
  TLogger logger;
  EXPECT_STATUS(logger.Initialize("zep"), kZEPStatusDirectoryAlreadyExists);
  std::filesystem::remove(Path("a"));
  EXPECT_EQ(logger.Initialize("zep"), kZEPStatusOK);
  EXPECT_EQ(ReadFile(Path("a/b/zep.log")), kOpenBanner);
}

TEST_F(TLoggerTest, InitializeMayBeCalledAgainAfterTheFileFailed) {
  TLogger::SetLogFileDir(Path("a/"));
  std::filesystem::create_directories(Path("a/zep.log"));
  TLogger logger;
  EXPECT_STATUS(logger.Initialize("zep"), kZEPStatusFileSystemError);
  EXPECT_EQ(logger.Initialize("other"), kZEPStatusOK);
  EXPECT_EQ(ReadFile(Path("a/other.log")), kOpenBanner);
}

TEST_F(TLoggerTest, ADirectoryThatMayNotBeMadeIsAccessDenied) {
  TLogger::SetLogFileDir("/zep-test-may-not-be-made/");
  EXPECT_EQ(ThrownWhenUnprivileged([] { TLogger().Initialize("zep"); }), kZEPStatusAccessDenied);
  EXPECT_FALSE(std::filesystem::exists("/zep-test-may-not-be-made"));
}

TEST_F(TLoggerTest, InitializeOpensThroughADerivedLogger) {
  struct TDerivedLogger : TLogger {
    void SetLogFilename(std::string path) override {
      fPaths.push_back(path);
      if (fPaths.size() == 1) throw TZEPException(kZEPStatusNotSupported);
    }
    std::vector<std::string> fPaths;
  };
  TLogger::SetLogFileDir(Path("a/"));
  TDerivedLogger logger;
  EXPECT_STATUS(logger.Initialize("first"), kZEPStatusNotSupported);
  EXPECT_EQ(logger.Initialize("second"), kZEPStatusOK);
  EXPECT_EQ(logger.Initialize("third"), kZEPStatusOK);
  EXPECT_THAT(logger.fPaths, ElementsAre(Path("a/first.log"), Path("a/second.log")));
  EXPECT_TRUE(std::filesystem::is_directory(Path("a")));
}

// ---- The line ----

TEST_F(TLoggerTest, TheSeveritiesHaveTheirNumbers) {
  EXPECT_EQ(ILogger::kLogError, 0);
  EXPECT_EQ(ILogger::kLogWarning, 1);
  EXPECT_EQ(ILogger::kLogStatus, 2);
  EXPECT_EQ(ILogger::kLogDebug, 3);
  EXPECT_EQ(ILogger::kLogVerbose, 4);
  EXPECT_EQ(ILogger::kLogMemoryOnly, 100);
  EXPECT_EQ(ILogger::kLogMemoryOnlyAlways, 101);
}

TEST_F(TLoggerTest, EverySeverityHasItsLabel) {
  struct {
    ILogger::EZEPLogSeverity fSeverity;
    char const* fLine;
  } const rows[] = {
      {ILogger::kLogError, "FDR_[Error] 3/3/2024  9:5:7 Collecting inventory\n"},
      {ILogger::kLogWarning, "FDR_[Warning] 3/3/2024  9:5:7 Collecting inventory\n"},
      {ILogger::kLogStatus, "FDR_[Status] 3/3/2024  9:5:7 Collecting inventory\n"},
      {ILogger::kLogDebug, "FDR_[Debug] 3/3/2024  9:5:7 Collecting inventory\n"},
      {ILogger::kLogVerbose, "FDR_[Verbose] 3/3/2024  9:5:7 Collecting inventory\n"},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fLine);
    EXPECT_EQ(WrittenAt({2024, 3, 3, 9, 5, 7}, row.fSeverity, "Collecting inventory"), row.fLine);
  }
}

TEST_F(TLoggerTest, TheTimeHasNoZeroFillAndNoFixedWidth) {
  struct {
    TFakeClock::TTime fTime;
    char const* fLine;
  } const rows[] = {
      {{2025, 1, 1, 0, 0, 5}, "FDR_[Debug] 1/1/2025  0:0:5 m\n"},
      {{2024, 3, 3, 9, 5, 7}, "FDR_[Debug] 3/3/2024  9:5:7 m\n"},
      {{1999, 12, 31, 23, 59, 59}, "FDR_[Debug] 12/31/1999  23:59:59 m\n"},
      {{2024, 10, 9, 10, 9, 10}, "FDR_[Debug] 10/9/2024  10:9:10 m\n"},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fLine);
    EXPECT_EQ(WrittenAt(row.fTime, ILogger::kLogDebug, "m"), row.fLine);
  }
}

// Each field of a time is read separately, so a line written at the turn of a second, an hour or a year may mix two times.
TEST_F(TLoggerTest, EachFieldOfTheTimeIsReadSeparately) {
  TLogger::SetLogThreshold(ILogger::kLogDebug);
  TLogger logger;
  logger.SetLogFilename(Path("a.log"));
  TFakeClock const clock({{2021, 1, 21, 1, 11, 10},  // second
                          {2022, 2, 22, 2, 12, 20},  // minute
                          {2023, 3, 23, 3, 13, 30},  // hour
                          {2024, 4, 24, 4, 14, 40},  // year
                          {2025, 5, 25, 5, 15, 50},  // day
                          {2026, 6, 26, 6, 16, 55},  // month
                          {2027, 7, 27, 7, 17, 57}});
  logger.OutputLogEntry(ILogger::kLogDebug, "probe");
  EXPECT_EQ(ReadFile(Path("a.log")), kOpenBanner + "FDR_[Debug] 6/25/2024  3:12:10 probe\n");
}

// The time of the line according to the C library, in the zone of the process.
std::string LocalTimeText() {
  std::time_t const now = std::chrono::system_clock::to_time_t(std::chrono::system_clock::now());
  std::tm const fields = *std::localtime(&now);
  std::ostringstream text;
  text << fields.tm_mon + 1 << "/" << fields.tm_mday << "/" << fields.tm_year + 1900 << "  " << fields.tm_hour << ":"
       << fields.tm_min << ":" << fields.tm_sec << " ";
  return text.str();
}

TEST_F(TLoggerTest, TheTimeIsLocal) {
  for (char const* zone : {"UTC0", "EAST-5:30", "WEST+8", "<+14>-14"}) {
    SCOPED_TRACE(zone);
    TEnvironmentGuard const guard("TZ", zone);
    ::tzset();
    std::string before, line, after;
    do {
      before = LocalTimeText();
      {
        TLogger logger;
        logger.SetLogFilename(Path("a.log"));
        logger.OutputLogEntry(ILogger::kLogStatus, "probe");
        line = ReadFile(Path("a.log")).substr(kOpenBanner.size());
      }
      after = LocalTimeText();
    } while (before != after);  // a second turned meanwhile
    EXPECT_EQ(line, "FDR_[Status] " + before + "probe\n");
  }
  ::tzset();
}

TEST_F(TLoggerTest, TheMessageIsWrittenUnchanged) {
  for (std::string const& message : {std::string(), std::string("100%s %n"), std::string("two\nlines\n"), std::string("\ttab\r"),
                                     std::string("\xc3\xa4\xff"), std::string(100000, 'x')}) {
    SCOPED_TRACE(message.substr(0, 20));
    EXPECT_EQ(WrittenAt({2024, 3, 3, 9, 5, 7}, ILogger::kLogDebug, message), "FDR_[Debug] 3/3/2024  9:5:7 " + message + "\n");
  }
}

TEST_F(TLoggerTest, AZeroByteEndsTheWrittenLine) {
  EXPECT_EQ(WrittenAt({2024, 3, 3, 9, 5, 7}, ILogger::kLogStatus, std::string("seen\0unseen", 11)),
            "FDR_[Status] 3/3/2024  9:5:7 seen");
  EXPECT_THAT(LoggedMessages(), ElementsAre(std::string("seen\0unseen", 11)));
}

TEST_F(TLoggerTest, EveryLineIsFlushedAtOnce) {
  TFakeClock const clock({{2024, 3, 3, 9, 5, 7}});
  TLogger logger;
  logger.SetLogFilename(Path("a.log"));
  std::string expected = kOpenBanner;
  EXPECT_EQ(ReadFile(Path("a.log")), expected);
  for (char const* message : {"one", "two"}) {
    logger.OutputLogEntry(ILogger::kLogError, message);
    expected += std::string("FDR_[Error] 3/3/2024  9:5:7 ") + message + "\n";
    EXPECT_EQ(ReadFile(Path("a.log")), expected);
  }
}

TEST_F(TLoggerTest, FailingWritesGoUnnoticed) {
  TLogger logger;
  logger.SetLogFilename("/dev/full");
  EXPECT_NO_THROW(logger.OutputLogEntry(ILogger::kLogStatus, "probe"));
  EXPECT_THAT(LoggedMessages(), ElementsAre("probe"));
}

// ---- Threshold and list ----

TEST_F(TLoggerTest, DebugEntryIsDroppedAtTheDefaultThreshold) {
  OnNewThread([this] {
    TLogger::GetInstance()->SetLogFilename(Path("a.log"));
    TLogger::GetInstance()->OutputLogEntry(ILogger::kLogDebug, "probe");
  });
  EXPECT_EQ(ReadFile(Path("a.log")), kOpenBanner + kCloseBanner);
  EXPECT_THAT(LoggedMessages(), IsEmpty());
}

TEST_F(TLoggerTest, DebugEntryIsWrittenButNotRecordedAtThresholdVerbose) {
  TFakeClock const clock({{2024, 3, 3, 9, 5, 7}});
  TLogger logger;
  logger.SetLogFilename(Path("a.log"));
  TLogger::SetLogThreshold(ILogger::kLogVerbose);
  logger.OutputLogEntry(ILogger::kLogDebug, "probe");
  EXPECT_EQ(ReadFile(Path("a.log")), kOpenBanner + "FDR_[Debug] 3/3/2024  9:5:7 probe\n");
  EXPECT_THAT(LoggedMessages(), IsEmpty());
}

struct TOutcome {
  bool fRecorded, fWritten, fThrown;
  bool operator==(TOutcome const& other) const {
    return fRecorded == other.fRecorded && fWritten == other.fWritten && fThrown == other.fThrown;
  }
};
std::ostream& operator<<(std::ostream& out, TOutcome const& outcome) {
  return out << (outcome.fRecorded ? "recorded " : "") << (outcome.fWritten ? "written " : "")
             << (outcome.fThrown ? "thrown" : "");
}

// The result of one entry, with a file and without.
TOutcome OutcomeOf(int severity, std::string const& file) {
  TLogger logger;
  logger.ClearLog();
  if (!file.empty()) logger.SetLogFilename(file);
  TOutcome outcome{};
  try {
    logger.OutputLogEntry(Severity(severity), "probe");
  } catch (TZEPException const& thrown) {
    outcome.fThrown = thrown.GetStatusCode() == kZEPStatusFail;
  }
  outcome.fRecorded = !logger.GetLog().empty();
  outcome.fWritten = !file.empty() && ReadFile(file).size() > kOpenBanner.size();
  return outcome;
}

TEST_F(TLoggerTest, SeverityAndThresholdDecideWhereAnEntryGoes) {
  struct {
    int fSeverity, fThreshold;
    TOutcome fWithFile, fWithoutFile;
  } const rows[] = {
      // at its own threshold, and one below
      {0, 0, {true, true, false}, {true, false, false}},
      {0, -1, {}, {}},
      {1, 1, {true, true, false}, {true, false, false}},
      {1, 0, {}, {}},
      {2, 2, {true, true, false}, {true, false, false}},
      {2, 1, {}, {}},
      {3, 3, {false, true, false}, {}},
      {3, 2, {}, {}},
      {4, 4, {false, true, false}, {}},
      {4, 3, {}, {}},
      // in memory only, whatever the threshold
      {100, 0, {true, false, false}, {true, false, false}},
      {100, -1000, {true, false, false}, {true, false, false}},
      {100, 1000, {true, false, false}, {true, false, false}},
      {101, 0, {true, false, false}, {true, false, false}},
      {101, -1000, {true, false, false}, {true, false, false}},
      {101, 1000, {true, false, false}, {true, false, false}},
      // unknown ones
      {7, 4, {}, {}},
      {7, 10, {false, false, true}, {}},
      {5, 5, {false, false, true}, {}},
      {99, 100, {false, false, true}, {}},
      {102, 101, {}, {}},
      {102, 102, {false, false, true}, {}},
      {INT_MAX, INT_MAX, {false, false, true}, {}},
      // negative ones are recorded first
      {-1, 2, {true, false, true}, {true, false, false}},
      {-1, -1, {true, false, true}, {true, false, false}},
      {-1, -2, {}, {}},
      {INT_MIN, 0, {true, false, true}, {true, false, false}},
      {INT_MIN, INT_MIN, {true, false, true}, {true, false, false}},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(testing::Message() << "severity " << row.fSeverity << ", threshold " << row.fThreshold);
    TLogger::SetLogThreshold(Severity(row.fThreshold));
    EXPECT_EQ(OutcomeOf(row.fSeverity, Path("a.log")), row.fWithFile);
    EXPECT_EQ(OutcomeOf(row.fSeverity, ""), row.fWithoutFile);
  }
}

TEST_F(TLoggerTest, AnEntryKeepsSeverityMessageAndTime) {
  TFakeClock const clock({{2024, 3, 3, 9, 5, 7}});
  TLogger logger;
  for (int severity : {-4, 0, 1, 2, 100, 101}) logger.OutputLogEntry(Severity(severity), "of " + std::to_string(severity));
  std::vector<int> severities;
  for (ILogger::TLogEntry const& entry : logger.GetLog()) {
    severities.push_back(entry.fSeverity);
    EXPECT_EQ(entry.fMessage, "of " + std::to_string(entry.fSeverity));
    EXPECT_EQ(entry.fTimeStamp.ToString(), "20240303090507.000000+000");
  }
  EXPECT_THAT(severities, ElementsAre(-4, 0, 1, 2, 100, 101));
}

TEST_F(TLoggerTest, TheTimeOfAnEntryIsReadBeforeThatOfItsLine) {
  TLogger logger;
  logger.SetLogFilename(Path("a.log"));
  TFakeClock const clock({{2020, 1, 1, 0, 0, 0}, {2024, 3, 3, 9, 5, 7}});
  logger.OutputLogEntry(ILogger::kLogStatus, "probe");
  EXPECT_EQ(logger.GetLog().back().fTimeStamp.GetYear(), 2020);
  EXPECT_EQ(ReadFile(Path("a.log")), kOpenBanner + "FDR_[Status] 3/3/2024  9:5:7 probe\n");
}

TEST_F(TLoggerTest, TheListIsOneForAllThreadsAndOutlivesTheLoggers) {
  std::list<ILogger::TLogEntry>* there = nullptr;
  OnNewThread([&there] {
    TLogger::GetInstance()->OutputLogEntry(ILogger::kLogError, "of a thread that has ended");
    there = &TLogger::GetInstance()->GetLog();
  });
  EXPECT_EQ(there, &TLogger::GetInstance()->GetLog());
  EXPECT_THAT(LoggedMessages(), ElementsAre("of a thread that has ended"));
}

TEST_F(TLoggerTest, PushBackLogAppendsACopy) {
  TLogger().OutputLogEntry(ILogger::kLogStatus, "first");
  ILogger::TLogEntry entry{ILogger::kLogVerbose, "pushed", TOSSpecific::GetLocalTime()};
  TLogger::PushBackLog(entry);
  entry.fMessage = "changed later";
  EXPECT_THAT(LoggedMessages(), ElementsAre("first", "pushed"));
  EXPECT_EQ(TLogger().GetLog().back().fSeverity, ILogger::kLogVerbose);
}

TEST_F(TLoggerTest, ClearLogEmptiesTheListAndKeepsTheFile) {
  TLogger logger;
  logger.SetLogFilename(Path("a.log"));
  logger.OutputLogEntry(ILogger::kLogStatus, "probe");
  std::string const written = ReadFile(Path("a.log"));
  OnNewThread([] { TLogger::GetInstance()->ClearLog(); });
  EXPECT_THAT(LoggedMessages(), IsEmpty());
  EXPECT_EQ(ReadFile(Path("a.log")), written);
}

TEST_F(TLoggerTest, ThreadsMayRecordAtTheSameTime) {
  constexpr int kThreads = 4, kEntries = 500;
  std::vector<std::thread> threads;
  for (int thread = 0; thread < kThreads; ++thread)
    threads.emplace_back([] {
      for (int entry = 0; entry < kEntries; ++entry) TLogger::GetInstance()->OutputLogEntry(ILogger::kLogStatus, "probe");
    });
  for (std::thread& thread : threads) thread.join();
  EXPECT_EQ(TLogger().GetLog().size(), static_cast<std::size_t>(kThreads * kEntries));
}

}  // namespace
}  // namespace NQRVZEP20
