// SPDX-License-Identifier: Apache-2.0

// The rules about the kernel's log, with records that show a problem, that show none, and without the log.

#include "tests/collect/findings/FindingsOf.h"

#include <gmock/gmock.h>

namespace NQRVZEP20 {
namespace {

using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;

constexpr int kOutOfMemory = 1, kProcessor = 2, kMemory = 3, kPciExpress = 4, kDisk = 6, kFileSystem = 7;
constexpr int kDegraded = 3, kMinor = 4, kMajor = 5, kCritical = 6;
constexpr int kHour = 3600, kDay = 24 * kHour;

std::string Record(int number, int kind, int severity, std::string const& subject, int age) {
  return "instance of ZEP_KernelLogRecord { RecordID = \"" + std::to_string(number) + "\"; RecordData = \"text " +
         std::to_string(number) + "\"; Kind = " + std::to_string(kind) + "; PerceivedSeverity = " + std::to_string(severity) +
         "; Subject = " + (subject.empty() ? "NULL" : "\"" + subject + "\"") + "; Age = " + std::to_string(age) + "; };";
}

TEST(LogRulesTest, AKilledProcessIsNamedWithAgeAndNumber) {
  std::string const rule = "out-of-memory";
  EXPECT_THAT(
      Problems(rule, Record(1, kOutOfMemory, kMajor, "tail", 5 * kHour) + Record(2, kOutOfMemory, kMajor, "tail", 90)),
      ElementsAre("error: the kernel killed the process tail because no memory was left, 2 times, most recently 1 minute ago"));
  EXPECT_THAT(Problems(rule, Record(1, kOutOfMemory, kMinor, "java", 3 * kDay)),
              ElementsAre("warning: the kernel killed the process java because its control group had reached its memory limit, "
                          "3 days ago"));
  EXPECT_THAT(Problems(rule, Record(1, kDisk, kMajor, "sda", 10)), IsEmpty());
}

TEST(LogRulesTest, AnErrorOfTheHardwareIsAnErrorUnlessItWasCorrected) {
  std::string const rule = "hardware-errors";
  EXPECT_THAT(Problems(rule, Record(1, kProcessor, kCritical, "CPU 0", 59)),
              ElementsAre("error: the kernel reports an error of the processor (machine check) CPU 0, less than a minute ago "
                          "(text 1)"));
  EXPECT_THAT(
      Problems(rule, Record(1, kMemory, kDegraded, "DIMM_A1", 3 * kHour) + Record(2, kMemory, kDegraded, "DIMM_A1", kHour)),
      ElementsAre("information: the kernel reports a corrected error of the memory DIMM_A1, 2 times, most recently "
                  "1 hour ago (text 2)"));
  EXPECT_THAT(Problems(rule, Record(1, kPciExpress, kMajor, "", 2 * kHour)),
              ElementsAre("error: the kernel reports an error of a PCI Express device, 2 hours ago (text 1)"));
  EXPECT_THAT(Problems(rule, Record(1, kOutOfMemory, kMajor, "tail", 10)), IsEmpty());
}

TEST(LogRulesTest, ErrorsOfDisksAndFileSystemsAreNamed) {
  std::string const rule = "disk-errors";
  EXPECT_THAT(Problems(rule, Record(1, kDisk, kMajor, "sda", 60) + Record(2, kDisk, kMinor, "nvme0", 120) +
                                 Record(3, kFileSystem, kMajor, "sdb1", 180)),
              ElementsAre("error: the kernel reports an input or output error of the disk sda, 1 minute ago (text 1)",
                          "error: the kernel reports an error of the file system on sdb1, 3 minutes ago (text 3)",
                          "warning: the kernel reports an input or output error of the disk nvme0, 2 minutes ago (text 2)"));
  EXPECT_THAT(Problems(rule, Record(1, kProcessor, kCritical, "CPU 0", 10)), IsEmpty());
}

TEST(LogRulesTest, ADiskThatHasVanishedSinceIsAWarning) {
  std::string const disks = "instance of CIM_DiskDrive { DeviceID = \"sda\"; };";
  EXPECT_THAT(Problems("disk-errors", disks + Record(1, kDisk, kMinor, "sda1", 60)),
              ElementsAre("warning: the kernel reports an input or output error of the disk sda1, 1 minute ago (text 1)"))
      << "a partition";
  EXPECT_THAT(Problems("disk-errors", disks + Record(1, kDisk, kMajor, "sda", 60) + Record(2, kDisk, kMajor, "sdb", 60)),
              ElementsAre("error: the kernel reports an input or output error of the disk sda, 1 minute ago (text 1)",
                          "warning: the kernel reports an input or output error of the disk sdb, which has vanished since, "
                          "1 minute ago (text 2)"));
}

TEST(LogRulesTest, TheFileSystemOfAVanishedDiskIsAWarning) {
  std::string const disks = "instance of CIM_DiskDrive { DeviceID = \"sda\"; };";
  EXPECT_THAT(
      Problems("disk-errors", disks + Record(1, kFileSystem, kMajor, "sda1", 60) + Record(2, kFileSystem, kMajor, "sdb1", 60) +
                                  Record(3, kFileSystem, kMajor, "dm-0", 60)),
      ElementsAre("error: the kernel reports an error of the file system on dm-0, 1 minute ago (text 3)",
                  "error: the kernel reports an error of the file system on sda1, 1 minute ago (text 1)",
                  "warning: the kernel reports an error of the file system on sdb1, which has vanished since, 1 minute "
                  "ago (text 2)"));
}

TEST(LogRulesTest, OldRecordsAreNotJudged) {
  std::string const old = Record(1, kOutOfMemory, kMajor, "tail", 7 * kDay + 1);
  EXPECT_THAT(Problems("out-of-memory", old), IsEmpty());
  TThresholds thresholds;
  thresholds.fKernelLogDays = 8;
  EXPECT_THAT(Problems("out-of-memory", old, thresholds), testing::SizeIs(1));
}

TEST(LogRulesTest, AProblemNamesTheNewestRecordAndARemedy) {
  TFindings const findings = FindingsOf(Record(1, kDisk, kMajor, "sda", 60) + Record(2, kDisk, kMajor, "sda", 30));
  ASSERT_THAT(findings.fProblems, testing::SizeIs(1));
  EXPECT_THAT(findings.fProblems.front().fInstance, HasSubstr("RecordID=\"2\""));
  EXPECT_THAT(findings.fProblems.front().fRemedy, HasSubstr("smartctl -x"));
  EXPECT_THAT(findings.fProblems.front().fRemedy, HasSubstr("dmesg --clear"));
}

TEST(LogRulesTest, ALogWithoutErrorsIsFine) {
  auto const log = [](char const* records, int gone, int leftOut, int unreadable = 0) {
    return std::string("instance of ZEP_KernelLog { InstanceID = \"ZEP:log:kernel\"; CurrentNumberOfRecords = ") + records +
           "; GoneRecords = " + std::to_string(gone) + "; LeftOutRecords = " + std::to_string(leftOut) +
           "; UnreadableRecords = " + std::to_string(unreadable) + "; };";
  };
  for (char const* rule : {"out-of-memory", "hardware-errors", "disk-errors"}) EXPECT_EQ(Outcome(rule, log("9", 0, 0)), "fine");
  auto const notAsked = [](std::string const& instances) {
    std::vector<std::string> reasons;
    TRuleResult const result = ResultOf("disk-errors", FindingsOf(instances));
    EXPECT_EQ(NameOf(result.fOutcome), "fine");
    for (TNotAsked const& each : result.fNotAsked) reasons.push_back(each.fReason);
    return reasons;
  };
  EXPECT_THAT(notAsked(log("9", 0, 0)), IsEmpty());
  EXPECT_THAT(notAsked(log("9", 7, 0)), ElementsAre("older records of the log are gone: 7"));
  EXPECT_THAT(notAsked(log("9", 0, 50)), ElementsAre("older records about errors were left out: 50"));
  EXPECT_THAT(notAsked(log("9", 0, 0, 2)), ElementsAre("records of the log have an unknown form: 2"));
  EXPECT_THAT(notAsked(log("NULL", 0, 0)), testing::SizeIs(1)) << "not all records were read";
  EXPECT_EQ(Outcome("disk-errors", Record(1, kOutOfMemory, kMajor, "tail", 10)), "fine");
}

}  // namespace
}  // namespace NQRVZEP20
