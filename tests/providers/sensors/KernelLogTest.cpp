// SPDX-License-Identifier: Apache-2.0

// Logs of real kernels (tests/data/kmsg), and written ones.

#include "providers/sensors/KernelLog.h"

#include "tests/Support.h"

#include <gmock/gmock.h>

#include <filesystem>

namespace NQRVZEP20 {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using testing::SizeIs;

// Kind and subject of each event.
std::vector<std::pair<int, std::string>> EventsOf(TKernelLog const& log) {
  std::vector<std::pair<int, std::string>> events;
  for (TKernelEvent const& event : log.fEvents) events.emplace_back(event.fKind, event.fSubject);
  return events;
}

TKernelLog Recorded(std::string const& name) { return KernelLogFrom(ReadFile(TestDataPath("kmsg/" + name))); }

TEST(KernelLogTest, TheStartOfAHealthyMachineReportsNoError) {
  TKernelLog const log = Recorded("healthy");
  EXPECT_EQ(log.fRecords, 380u);
  EXPECT_EQ(log.fGone + log.fUnreadable + log.fLeftOut, 0u);
  EXPECT_TRUE(log.fIsWhole);
  EXPECT_THAT(log.fEvents, IsEmpty());
}

TEST(KernelLogTest, KilledProcessesAndErrorsOfDisksAreFound) {
  TKernelLog const log = Recorded("memory-and-disk");
  EXPECT_EQ(log.fGone, 380u);
  using TPair = std::pair<int, std::string>;
  EXPECT_THAT(EventsOf(log), ElementsAre(TPair(TKernelEvent::kOutOfMemory, "tail"), TPair(TKernelEvent::kDisk, "dm-0"),
                                         TPair(TKernelEvent::kDisk, "sda"), TPair(TKernelEvent::kDisk, "sda"),
                                         TPair(TKernelEvent::kOutOfMemory, "tail")));
}

TEST(KernelLogTest, MachineChecksAndErrorsOfFileSystemsAreFound) {
  TKernelLog const log = Recorded("machine-check-and-file-system");
  ASSERT_THAT(log.fEvents, SizeIs(7));
  EXPECT_EQ(log.fEvents[0].fKind, TKernelEvent::kProcessor);
  EXPECT_EQ(log.fEvents[0].fSeverity, TKernelEvent::kDegraded);
  EXPECT_EQ(log.fEvents[0].fMessage.fMicroseconds, 13808205u);
  EXPECT_EQ(log.fEvents[2].fKind, TKernelEvent::kFileSystem);
}

std::string DiskError(int number) { return "3," + std::to_string(number) + ",1,-;I/O error, dev sda, sector 1\n DEVICE=b8:0\n"; }

TEST(KernelLogTest, TheNewestErrorsOfEachKindAreKept) {
  std::string records = "3,0,1,-;Out of memory: Killed process 1 (a) total-vm:1kB\n";
  for (int number = 1; number <= 150; ++number) records += DiskError(number);
  TKernelLog const log = KernelLogFrom(records);
  EXPECT_EQ(log.fRecords, 151u);
  EXPECT_EQ(log.fLeftOut, 50u);
  ASSERT_THAT(log.fEvents, SizeIs(101));
  EXPECT_EQ(log.fEvents[0].fSubject, "a") << "other kinds do not push it out";
  EXPECT_EQ(log.fEvents[1].fMessage.fNumber, 51u);
}

TEST(KernelLogTest, GapsAndUnknownFormsAreCounted) {
  TKernelLog const log = KernelLogFrom(DiskError(10) + DiskError(11) + DiskError(20) + "nonsense\n\n6,21,5,-;no end of line");
  EXPECT_EQ(log.fRecords, 4u);
  EXPECT_EQ(log.fGone, 18u);
  EXPECT_EQ(log.fUnreadable, 1u);
}

TEST(KernelLogTest, TheNewestErrorOfALongLogIsKept) {
  std::string records;
  constexpr int many = 600000;
  for (int number = 0; number < many; ++number) records += "6," + std::to_string(number) + ",1,-;\n";
  TKernelLog const log = KernelLogFrom(records + DiskError(many));
  EXPECT_EQ(log.fRecords, many + 1U);
  EXPECT_TRUE(log.fIsWhole);
  EXPECT_THAT(log.fEvents, SizeIs(1));
}

TEST(KernelLogTest, ALogThatTakesTooLongIsReadInPart) {
  auto const log = ReadKernelLog(TMachineFiles("/"), std::chrono::seconds(0));
  if (!log) {
    EXPECT_NE(log.Why().fReason, "");
    return;
  }
  EXPECT_FALSE(log->fIsWhole);
}

TEST(KernelLogTest, ARecordedMachineHasAFile) {
  TTempDir const dir;
  TMachineFiles const files(dir.Path());
  EXPECT_EQ(ReadKernelLog(files).Why().fReason, "/dev/kmsg does not exist, as in most containers");
  std::filesystem::create_directories(dir.Path("dev"));
  WriteFile(dir.Path("dev/kmsg"), DiskError(0));
  EXPECT_THAT(ReadKernelLog(files)->fEvents, SizeIs(1));
}

TEST(KernelLogTest, AFileThatCannotBeReadHasAReason) {
  TTempDir const dir;
  std::filesystem::create_directories(dir.Path("dev/kmsg"));
  auto const log = ReadKernelLog(TMachineFiles(dir.Path()));
  ASSERT_FALSE(log);
  EXPECT_EQ(log.Why().fReason, "/dev/kmsg is not a regular file");
}

TEST(KernelLogTest, TheLogOfThisMachineIsReadWithoutWaiting) {
  auto const log = ReadKernelLog(TMachineFiles("/"));
  if (!log) {
    EXPECT_NE(log.Why().fReason, "");
    return;
  }
  EXPECT_TRUE(log->fIsWhole);
  EXPECT_EQ(log->fUnreadable, 0u);
}

}  // namespace
}  // namespace NQRVZEP20
