// SPDX-License-Identifier: Apache-2.0
#include "TCommUtil.h"
#include "TOSSpecific.h"
#include "tests/os/FakeClock.h"
#include "tests/os/HostTools.h"

#include <fcntl.h>
#include <signal.h>
#include <time.h>

#include <atomic>
#include <chrono>
#include <ctime>
#include <utility>

namespace NQRVZEP20 {
namespace {

using namespace std::chrono_literals;
using TClock = std::chrono::steady_clock;

// Like ToUIString.
std::string TextOf(std::tm const& fields) {
  char text[32];
  std::strftime(text, sizeof text, "%m/%d/%Y %H:%M:%S", &fields);
  return text;
}

std::int64_t ClockMilliseconds() {
  timespec now;
  ::clock_gettime(CLOCK_REALTIME, &now);
  return now.tv_sec * std::int64_t{1000} + now.tv_nsec / 1000000;
}

// The result of GetLocalTime, and the fields of the same second according to the C library.
std::pair<TCIMDateTime, std::tm> LocalTimeAndFields() {
  for (;;) {
    std::time_t const before = ClockMilliseconds() / 1000;
    TCIMDateTime const time = TOSSpecific::GetLocalTime();
    if (ClockMilliseconds() / 1000 != before) continue;
    std::tm fields;
    ::tzset();
    ::localtime_r(&before, &fields);
    return {time, fields};
  }
}

struct TZone {
  char const* fText;
  int fStandardOffset;  // minutes east of UTC
};

TZone const kZones[] = {
    {"UTC0", 0},
    {"XST-1", 60},
    {"XST5", -300},
    {"XST-5:30", 330},
    {"XST-5:45", 345},
    {"XST3:30", -210},
    {"XST0:30", -30},
    {"XST-14", 840},
    {"XST12", -720},
    {"CET-1CEST,M3.5.0,M10.5.0/3", 60},
    {"EST5EDT,M3.2.0,M11.1.0", -300},
    {"NST3:30NDT,M3.2.0,M11.1.0", -210},
    {"AEST-10AEDT,M10.1.0,M4.1.0/3", 600},
    {"LHST-10:30LHDT-11", 630},
    {"LHST-10:30LHDT-11,M10.1.0,M4.1.0", 630},
    {"XST-1XDT,0/0,J365/49", 60},          // daylight saving all the year round
    {"XST5XDT,0/-24,J365/49", -300},       // so here,
    {"XST-10:30XDT-11,0/0,J365/49", 630},  // and here by half an hour
    {"<+0130>-1:30", 90},
    {"Etc/UTC", 0},
    {"America/New_York", -300},
    {"America/Phoenix", -420},
    {"America/St_Johns", -210},
    {"America/Santiago", -240},
    {"Asia/Kolkata", 330},
    {"Asia/Kathmandu", 345},
    {"Asia/Tokyo", 540},
    {"Australia/Lord_Howe", 630},
    {"Australia/Sydney", 600},
    {"Europe/Berlin", 60},
    {"Pacific/Auckland", 720},
    {":Europe/Berlin", 60},
    {"", 0},
    {"No/Such_Zone", 0},
};

TEST(GetLocalTimeTest, IsTheLocalTimeOfTheZone) {
  for (TZone const& row : kZones) {
    SCOPED_TRACE(row.fText);
    TEnvironmentGuard const zone("TZ", row.fText);
    auto const [time, fields] = LocalTimeAndFields();
    EXPECT_FALSE(time.IsNull());
    EXPECT_FALSE(time.IsInterval());
    EXPECT_EQ(time.ToUIString(), TextOf(fields));
  }
}

TEST(GetLocalTimeTest, OffsetIsThatOfStandardTimePlusAnHourInDaylightSaving) {
  for (TZone const& row : kZones) {
    SCOPED_TRACE(row.fText);
    TEnvironmentGuard const zone("TZ", row.fText);
    auto const [time, fields] = LocalTimeAndFields();
    EXPECT_EQ(time.GetUTCOffset(), row.fStandardOffset + (fields.tm_isdst > 0 ? 60 : 0));
  }
}

TEST(GetLocalTimeTest, OffsetInZonesThatNeverOrAlwaysSaveDaylight) {
  TZone const zones[] = {
      {"XST-1", 60},
      {"XST5", -300},
      {"XST-5:30", 330},
      {"XST-1XDT,0/0,J365/49", 120},
      {"XST5XDT,0/-24,J365/49", -240},
      {"XST-5:30XDT,0/0,J365/49", 390},
      {"XST-10:30XDT-11,0/0,J365/49", 690},  // 60 also where the zone shifts by half an hour,
      {"XST-1XDT0,0/0,J365/49", 120},        // or back, as the Irish winter does
  };
  for (TZone const& row : zones) {
    SCOPED_TRACE(row.fText);
    TEnvironmentGuard const zone("TZ", row.fText);
    EXPECT_EQ(TOSSpecific::GetLocalTime().GetUTCOffset(), row.fStandardOffset);
  }
}

TEST(GetLocalTimeTest, FollowsTheZoneThroughTheYear) {
  struct TRow {
    char const* fZone;
    TFakeClock::TTime fTime;
    char const* fText;
  };
  TRow const rows[] = {
      {"UTC0", {2024, 2, 29, 23, 59, 59}, "20240229235959.000000+000"},
      {"XST-1", {2023, 12, 31, 23, 59, 59}, "20240101005959.000000+060"},
      {"XST5", {2024, 1, 1, 4, 59, 59}, "20231231235959.000000-300"},
      {"UTC0", {2096, 2, 29, 1, 2, 3}, "20960229010203.000000+000"},
      {"Europe/Berlin", {2024, 1, 15, 12, 0, 0}, "20240115130000.000000+060"},
      {"Europe/Berlin", {2024, 3, 31, 0, 59, 59}, "20240331015959.000000+060"},
      {"Europe/Berlin", {2024, 3, 31, 1, 0, 0}, "20240331030000.000000+120"},
      {"Europe/Berlin", {2024, 10, 27, 0, 59, 59}, "20241027025959.000000+120"},
      {"Europe/Berlin", {2024, 10, 27, 1, 0, 0}, "20241027020000.000000+060"},
      {"Europe/Berlin", {2050, 7, 15, 12, 0, 0}, "20500715140000.000000+120"},
      {"America/New_York", {2024, 1, 15, 12, 0, 0}, "20240115070000.000000-300"},
      {"America/New_York", {2024, 7, 15, 12, 0, 0}, "20240715080000.000000-240"},
      {"America/St_Johns", {2024, 1, 15, 12, 0, 0}, "20240115083000.000000-210"},
      {"America/St_Johns", {2024, 7, 15, 12, 0, 0}, "20240715093000.000000-150"},
      {"America/Santiago", {2024, 1, 15, 12, 0, 0}, "20240115090000.000000-180"},
      {"Asia/Kolkata", {2024, 7, 15, 12, 0, 0}, "20240715173000.000000+330"},
      // Standard time itself changed here.
      {"America/Caracas", {2015, 7, 15, 12, 0, 0}, "20150715073000.000000-270"},
      {"America/Caracas", {2017, 7, 15, 12, 0, 0}, "20170715080000.000000-240"},
      // Daylight saving that shifts by half an hour, or backwards in winter: 60 minutes all the same.
      {"Australia/Lord_Howe", {2024, 1, 15, 12, 0, 0}, "20240115230000.000000+690"},
      {"Australia/Lord_Howe", {2024, 7, 15, 12, 0, 0}, "20240715223000.000000+630"},
      {"IST-1GMT0,M10.5.0,M3.5.0/1", {2024, 1, 15, 12, 0, 0}, "20240115120000.000000+120"},
      {"IST-1GMT0,M10.5.0,M3.5.0/1", {2024, 7, 15, 12, 0, 0}, "20240715130000.000000+060"},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(testing::Message() << row.fZone << " in month " << row.fTime.fMonth << " of " << row.fTime.fYear);
    TFakeClock const clock({row.fTime});
    TEnvironmentGuard const zone("TZ", row.fZone);
    EXPECT_EQ(TOSSpecific::GetLocalTime().ToString(), row.fText);
    EXPECT_EQ(TOSSpecific::GetLocalTime().ToString(), row.fText);
  }
}

TEST(GetLocalTimeTest, FollowsAClockThatJumps) {
  TFakeClock const clock({{2024, 7, 15, 12, 0, 0}, {2024, 7, 15, 12, 0, 1}, {2024, 7, 15, 12, 0, 0}, {2031, 1, 2, 3, 4, 5}});
  EXPECT_EQ(TOSSpecific::GetLocalTime().ToString(), "20240715120000.000000+000");
  EXPECT_EQ(TOSSpecific::GetLocalTime().ToString(), "20240715120001.000000+000");
  EXPECT_EQ(TOSSpecific::GetLocalTime().ToString(), "20240715120000.000000+000");
  EXPECT_EQ(TOSSpecific::GetLocalTime().ToString(), "20310102030405.000000+000");
}

TEST(GetLocalTimeTest, EachCallReadsTheZone) {
  std::string const longName = "<" + std::string(100, 'X') + ">";  // the difference is far from the start
  std::pair<std::string, int> const zones[] = {{"UTC0", 0},   {"XST-1", 60},          {"XST-2", 120},
                                               {"XST-1", 60}, {longName + "-3", 180}, {longName + "-4", 240},
                                               {"", 0},       {"XST5", -300}};
  for (int round = 0; round < 3; ++round)
    for (auto const& [text, offset] : zones) {
      SCOPED_TRACE(text);
      TEnvironmentGuard const zone("TZ", text.c_str());
      EXPECT_EQ(TOSSpecific::GetLocalTime().GetUTCOffset(), offset);
      TEnvironmentGuard const none("TZ", nullptr);
      auto const [time, fields] = LocalTimeAndFields();
      EXPECT_EQ(time.ToUIString(), TextOf(fields));
    }
}

// Asia/Kathmandu skipped this time when it changed its standard time.
std::string ValidityInTheZone(char const* file) {
  std::string const zones = "/usr/share/zoneinfo/";
  if (file != nullptr) WriteFile("/etc/new", ReadFile(zones + file)), std::filesystem::rename("/etc/new", "/etc/localtime");
  std::this_thread::sleep_for(1100ms);
  try {
    TCIMDateTime(std::string("19860101000500.000000+000"));
    return "valid ";
  } catch (TZEPException const&) {
    return "invalid ";
  }
}

TEST(GetLocalTimeTest, TimestampsFollowTheFileOfTheZoneWithinASecond) {
  NEEDS(MayMount(), "permission to mount");
  NEEDS(std::filesystem::exists("/usr/share/zoneinfo/Asia/Kathmandu"), "the zones (package tzdata)");
  auto const validities = [] {
    TEnvironmentGuard const zone("TZ", nullptr);
    if (!MountTmpfs("/etc", "")) return std::string("cannot mount");
    std::string result = ValidityInTheZone("Etc/UTC") + ValidityInTheZone("Asia/Kathmandu") + ValidityInTheZone("Etc/UTC");
    ::setenv("TZ", "Asia/Kathmandu", 1);
    result += ValidityInTheZone(nullptr);
    ::unsetenv("TZ");
    result += ValidityInTheZone("Asia/Kathmandu");
    std::filesystem::remove("/etc/localtime");
    return result + ValidityInTheZone(nullptr);
  };
  EXPECT_EQ(InChild(validities), "valid invalid valid invalid invalid valid ");
}

TEST(GetLocalTimeTest, IsExactToTheMillisecond) {
  TEnvironmentGuard const zone("TZ", "UTC0");
  for (int round = 0; round < 1000; ++round) {
    std::int64_t const before = ClockMilliseconds();
    TCIMDateTime const time = TOSSpecific::GetLocalTime();
    std::int64_t const after = ClockMilliseconds();
    std::tm fields{};
    fields.tm_year = time.GetYear() - 1900, fields.tm_mon = time.GetMonth() - 1, fields.tm_mday = static_cast<int>(time.GetDay());
    fields.tm_hour = time.GetHour(), fields.tm_min = time.GetMinute(), fields.tm_sec = time.GetSecond();
    std::int64_t const told = ::timegm(&fields) * std::int64_t{1000} + time.GetMicroSeconds() / 1000;
    EXPECT_LE(before, told);
    EXPECT_LE(told, after);
    EXPECT_EQ(time.GetMicroSeconds() % 1000, 0u);
  }
}

TEST(GetLocalTimeTest, IsEqualTwiceWithinAMillisecond) {
  int pairs = 0;
  for (int round = 0; round < 1000; ++round) {
    std::int64_t const before = ClockMilliseconds();
    TCIMDateTime const first = TOSSpecific::GetLocalTime(), second = TOSSpecific::GetLocalTime();
    if (ClockMilliseconds() != before) continue;
    EXPECT_TRUE(first == second);
    ++pairs;
  }
  EXPECT_GT(pairs, 0);
}

TEST(GetLocalTimeTest, WorksInManyThreads) {
  TEnvironmentGuard const zone("TZ", "XST-1XDT,0/0,J365/49");
  std::atomic<int> wrong{0};
  std::vector<std::thread> threads;
  for (int i = 0; i < 4; ++i)
    threads.emplace_back([&] {
      for (int round = 0; round < 2000; ++round)
        if (TOSSpecific::GetLocalTime().GetUTCOffset() != 120) ++wrong;
    });
  for (std::thread& thread : threads) thread.join();
  EXPECT_EQ(wrong, 0);
}

// The logger itself uses these.
TEST(HostBasicsTest, NoneOfThemLogs) {
  TTempDir const dir;
  OnNewThread([&] {
    TLogCapture const log;
    std::size_t const entries = TLogger::GetInstance()->GetLog().size();
    TOSSpecific::GetLocalTime();
    TOSSpecific::isOEMBuild();
    TOSSpecific::FileExists(dir.Path("missing"));
    TOSSpecific::DirExists(dir.Path());
    TCommUtil::MkDirHier(dir.Path("a/b"));
    EXPECT_STATUS(TOSSpecific::CreateDir(dir.Path("a/b")), kZEPStatusDirectoryAlreadyExists);
    EXPECT_STATUS(TCommUtil::MkDirHier(dir.Path(std::string(300, 'x'))), kZEPStatusFileSystemError);
    EXPECT_TRUE(log.Entries().empty());
    EXPECT_EQ(TLogger::GetInstance()->GetLog().size(), entries);

    TLogger::GetInstance()->OutputLogEntry(ILogger::kLogVerbose, "probe");  // the capture does see log entries
    EXPECT_EQ(log.Entries(), std::vector<std::string>{"[Verbose] probe"});
  });
}

// ---- USleep ----

TEST(USleepTest, SleepsMilliseconds) {
  auto const start = TClock::now();
  EXPECT_EQ(TOSSpecific::USleep(250), 0);
  auto const slept = TClock::now() - start;
  EXPECT_GE(slept, 250ms);
  EXPECT_LT(slept, 10s);
  EXPECT_EQ(TOSSpecific::USleep(0), 0);
}

TEST(USleepTest, ASignalEndsItEarly) {
  struct sigaction action {
  }, old;
  action.sa_handler = [](int) {};
  ::sigaction(SIGUSR1, &action, &old);
  // The last of these in microseconds is more than 32 bits hold.
  for (unsigned int const milliseconds : {60000u, 4294968u}) {
    std::atomic<bool> done{false};
    auto const start = TClock::now();
    std::thread interrupter([&done, sleeper = ::pthread_self()] {
      std::this_thread::sleep_for(200ms);
      while (!done) {
        ::pthread_kill(sleeper, SIGUSR1);
        std::this_thread::sleep_for(20ms);
      }
    });
    EXPECT_EQ(TOSSpecific::USleep(milliseconds), -1);
    EXPECT_GE(TClock::now() - start, 150ms);
    done = true;
    interrupter.join();
  }
  ::sigaction(SIGUSR1, &old, nullptr);
}

// ---- Who and where ----

TEST(IsAdminTest, ChecksTheRealUser) {
  EXPECT_EQ(TOSSpecific::IsAdmin(), ::getuid() == 0);
  EXPECT_EQ(InChild([] { return !BecomeUnprivileged()    ? "still root"
                                : TOSSpecific::IsAdmin() ? "admin"
                                                         : "no admin"; }),
            "no admin");
  NEEDS(::getuid() == 0, "root");
  EXPECT_EQ(InChild([] { return ::seteuid(65534) != 0    ? "still root"
                                : TOSSpecific::IsAdmin() ? "admin"
                                                         : "no admin"; }),
            "admin");
}

// The result in a child where the file in /proc holds that text, or does not exist.
std::string RunningTypeWith(std::function<void()> const& prepare) {
  return InChild([&] {
    if (!MountTmpfs("/proc", "")) return std::string("not mounted");
    prepare();
    return std::to_string(TOSSpecific::GetRunningTypeOnXen());
  });
}

void MakeCapabilities(std::string const& text) {
  std::filesystem::create_directory("/proc/xen");
  WriteFile("/proc/xen/capabilities", text);
}

TEST(GetRunningTypeOnXenTest, DistinguishesHostsFromDomains) {
  NEEDS(MayMount(), "leave to mount a file system");
  EXPECT_EQ(RunningTypeWith([] {}), "2");
  EXPECT_EQ(RunningTypeWith([] { std::filesystem::create_directories("/proc/xen/capabilities"); }), "2");
  EXPECT_EQ(RunningTypeWith([] { MakeCapabilities("control_d\n"); }), "0");
  EXPECT_EQ(RunningTypeWith([] { MakeCapabilities("other, control_domain"); }), "0");
  EXPECT_EQ(RunningTypeWith([] { MakeCapabilities(""); }), "1");
  EXPECT_EQ(RunningTypeWith([] { MakeCapabilities("control\n"); }), "1");
  EXPECT_EQ(RunningTypeWith([] {
              MakeCapabilities("control_d\n");
              std::filesystem::permissions("/proc/xen/capabilities", std::filesystem::perms::none);
              BecomeUnprivileged();
            }),
            "threw kZEPStatusFileNotFound");
}

TEST(GetRunningTypeOnXenTest, ReadsNothingWithoutXen) {
  if (std::filesystem::exists("/proc/xen/capabilities")) GTEST_SKIP() << "this machine is a guest of Xen";
  EXPECT_EQ(LogOf([] { EXPECT_EQ(TOSSpecific::GetRunningTypeOnXen(), 2); }), std::vector<std::string>{});
}

// ---- The shell, the command line and the flags ----

TEST(LaunchCommandShellTest, RunsTheShellAndReturnsItsStatus) {
  TTempDir const dir;
  WriteFile(dir.Path("input"), "echo typed > " + dir.Path("output") + "\nexit 3\n");
  TUniqueFd const file(::open(dir.Path("input").c_str(), O_RDONLY));
  TStandardInput const input(file.get());
  int const status = TOSSpecific::LaunchCommandShell();
  EXPECT_TRUE(WIFEXITED(status));
  EXPECT_EQ(WEXITSTATUS(status), 3);
  EXPECT_EQ(ReadFile(dir.Path("output")), "typed\n");
}

TEST(ExpandCommandLineWildcardsTest, ReturnsBothUnchanged) {
  char program[] = "program", pattern[] = "*.h";
  char* arguments[] = {program, pattern, nullptr};
  int count = 0;
  char** expanded = nullptr;
  TOSSpecific::ExpandCommandLineWildcards(2, arguments, &count, &expanded);
  EXPECT_EQ(count, 2);
  EXPECT_EQ(expanded, arguments);
  EXPECT_STREQ(expanded[1], "*.h");
  TOSSpecific::ExpandCommandLineWildcards(0, nullptr, &count, &expanded);
  EXPECT_EQ(count, 0);
  EXPECT_EQ(expanded, nullptr);
}

TEST(FlagsTest, AreFalseAtTheStartAndEachForItself) {
  EXPECT_FALSE(TOSSpecific::getLuz());
  EXPECT_FALSE(TOSSpecific::isZEPParser());
  TOSSpecific::setLuz(true);
  EXPECT_TRUE(TOSSpecific::getLuz());
  EXPECT_TRUE(isLuz);
  EXPECT_FALSE(TOSSpecific::isZEPParser());
  TOSSpecific::setLuz(false);
  TOSSpecific::setZEPParser(true);
  EXPECT_FALSE(TOSSpecific::getLuz());
  EXPECT_TRUE(TOSSpecific::isZEPParser());
  EXPECT_TRUE(isParser);
  isParser = false;
  EXPECT_FALSE(TOSSpecific::isZEPParser());
}

}  // namespace
}  // namespace NQRVZEP20
