// SPDX-License-Identifier: Apache-2.0
#include "providers/host/RunningRecords.h"

#include "tests/Machines.h"
#include "tests/Support.h"
#include "tests/providers/host/KernelTree.h"
#include "tests/providers/host/Structures.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/timex.h>

namespace NQRVZEP20 {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

TEST(RunningRecordsTest, TaintHasAWordForEachBit) {
  EXPECT_THAT(TaintWords(0), IsEmpty());
  EXPECT_THAT(
      TaintWords(1 | 1 << 12 | 1ull << 40),
      ElementsAre("P: a proprietary module was loaded", "O: a module from outside the kernel's tree was loaded", "bit 40"));
  EXPECT_EQ(TaintWords(~0ull).size(), 64u);
}

TEST(RunningRecordsTest, AFailedUnitOfARealSystemdIsListed) {
  TRecordedMachine const machine("degraded");
  TMachineFiles const files(machine.Root());
  EXPECT_EQ(PropertyOf(RunningRecord(files, TMemInfo::ReadFrom(files, "/proc/meminfo")), "FailedUnits"),
            "string { backup.service }");
}

TEST(RunningRecordsTest, FailedUnitsAreThoseOfTheList) {
  EXPECT_THAT(*FailedUnitsFrom("[]"), IsEmpty());
  EXPECT_THAT(*FailedUnitsFrom(R"([{"unit":"a.service","load":"loaded"},{"unit":"b.mount"}])"),
              ElementsAre("a.service", "b.mount"));
  for (char const* text : {"", "{}", "[1]", "[{}]", R"([{"unit":1}])", "[{\"unit\":\"a\"}", "System has not been booted"})
    EXPECT_EQ(FailedUnitsFrom(text).Why().fReason, "the output of systemctl --failed is not a list of units") << text;
}

TEST(RunningRecordsTest, TheClockIsSynchronizedUnlessTheKernelDoubtsIt) {
  timex state = {};
  auto const result = [&] { return IsSynchronized({reinterpret_cast<char const*>(&state), sizeof state}); };
  EXPECT_TRUE(*result());
  state.status = STA_UNSYNC | STA_PLL;
  EXPECT_FALSE(*result());
  EXPECT_EQ(IsSynchronized("x").Why().fReason, "adjtimex returned a structure of another size");
}

TEST(RunningRecordsTest, TheStateIsThatOfTheFiles) {
  TTempDir const root;
  TKernelTree const tree(root.Path());
  tree.Write("/proc/uptime", "3600.71 7000.00");
  tree.Write("/proc/loadavg", "0.25 0.50 1.75 1/80 11206");
  tree.Write("/proc/meminfo", "MemAvailable: 4 kB");
  tree.Write("/proc/sys/kernel/tainted", "512");
  tree.Write("/zep-answers/systemctl/failed", "[]");
  TMachineFiles const files(root.Path());
  TRecord const record = RunningRecord(files, TMemInfo::ReadFrom(files, "/proc/meminfo"));
  EXPECT_EQ(PropertyOf(record, "Uptime"), "uint64 3600");
  EXPECT_EQ(PropertyOf(record, "LoadOfOneMinute"), "real32 0.25");
  EXPECT_EQ(PropertyOf(record, "LoadOfFiveMinutes"), "real32 0.5");
  EXPECT_EQ(PropertyOf(record, "LoadOfFifteenMinutes"), "real32 1.75");
  EXPECT_EQ(PropertyOf(record, "AvailableMemory"), "uint64 4096");
  EXPECT_EQ(PropertyOf(record, "Taint"), "uint64 512");
  EXPECT_EQ(PropertyOf(record, "TaintReasons"), "string { W: the kernel issued a warning }");
  EXPECT_EQ(PropertyOf(record, "ClockSynchronized"), "boolean NULL not-given: /zep-answers/adjtimex does not exist");
  tree.Write("/proc/loadavg", "0.25 x");
  EXPECT_EQ(PropertyOf(RunningRecord(files, TMemInfo("", TMissing())), "LoadOfOneMinute"),
            "real32 NULL unexpected-form: /proc/loadavg contains \"0.25 x\"");
}

}  // namespace
}  // namespace NQRVZEP20
