// SPDX-License-Identifier: Apache-2.0

// The rules about disks, arrays and file systems with instances that have a problem, that are fine, and that cannot be judged.

#include "tests/collect/findings/FindingsOf.h"

#include <gmock/gmock.h>

namespace NQRVZEP20 {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

// ---- Disks ----

TEST(StorageRulesTest, AFailingDiskIsCritical) {
  EXPECT_THAT(Problems("disk-failing", R"(instance of CIM_DiskDrive { DeviceID = "sda"; HealthState = 20; };
                                          instance of CIM_DiskDrive { DeviceID = "sdb"; HealthState = 5; };)"),
              ElementsAre("critical: the disk sda reports that it is failing (SMART)"));
}

TEST(StorageRulesTest, AHotDiskIsAWarning) {
  std::string const disk = R"(instance of CIM_DiskDrive { DeviceID = "nvme0n1"; HealthState = 10; };)";
  EXPECT_THAT(Problems("disk-failing", disk),
              ElementsAre("warning: the disk nvme0n1 reports a temperature out of its range (SMART)"));
  EXPECT_THAT(FindingsOf(disk).fProblems.at(0).fRemedy, testing::HasSubstr("air flow"));
}

TEST(StorageRulesTest, ADiskOfUnknownHealthCannotBeJudged) {
  EXPECT_EQ(Outcome("disk-failing", R"(instance of CIM_DiskDrive { DeviceID = "sda"; };)"), "not-asked");
  EXPECT_EQ(Outcome("disk-failing", R"(instance of CIM_DiskDrive { DeviceID = "sda"; };
                                       instance of CIM_DiskDrive { DeviceID = "sdb"; HealthState = 5; };)"),
            "fine");
}

TEST(StorageRulesTest, ADiskThatTheKernelCannotUseIsAnError) {
  EXPECT_THAT(Problems("disk-lost", R"(
      instance of CIM_DiskDrive { DeviceID = "sda"; OperationalStatus = {6}; StatusDescriptions = {"offline"}; };
      instance of CIM_DiskDrive { DeviceID = "sdb"; OperationalStatus = {2}; };
      instance of CIM_DiskDrive { DeviceID = "vda"; };)"),
              ElementsAre("error: the kernel cannot use the disk sda (offline)"));
}

TEST(StorageRulesTest, AWornDiskIsNamedWithItsWear) {
  EXPECT_THAT(Problems("disk-worn", R"(
      instance of ZEP_DiskHealth { InstanceID = "1"; ElementName = "Health of nvme0n1"; Disk = "nvme0n1"; PercentageUsed = 104; AvailableSpare = 4;
                                   AvailableSpareThreshold = 10; };
      instance of ZEP_DiskHealth { InstanceID = "2"; ElementName = "Health of nvme1n1"; Disk = "nvme1n1"; PercentageUsed = 89; AvailableSpare = 100;
                                   AvailableSpareThreshold = 10; };
      instance of ZEP_DiskHealth { InstanceID = "3"; ElementName = "Health of sda"; Disk = "sda"; };)"),
              ElementsAre("error: the disk nvme0n1 has only 4 % of its spare blocks left",
                          "warning: the disk nvme0n1 has used 104 % of its expected life"));
}

TEST(StorageRulesTest, BadSectorsAreCounted) {
  EXPECT_THAT(Problems("disk-sectors", R"(
      instance of ZEP_DiskHealth { InstanceID = "1"; ElementName = "Health of sda"; Disk = "sda"; PendingSectors = 8; UncorrectableErrors = 0;
                                   ReallocatedSectors = 51; };
      instance of ZEP_DiskHealth { InstanceID = "2"; ElementName = "Health of sdb"; Disk = "sdb"; PendingSectors = 0; ReallocatedSectors = 50; };)"),
              ElementsAre("error: the disk sda has unreadable sectors: 8", "warning: the disk sda has replaced bad sectors: 51"));
}

std::string Array(std::string const& state) { return "instance of ZEP_RaidArray { DeviceID = \"md0\"; " + state + " };"; }

TEST(StorageRulesTest, AnArrayIsJudgedByItsRedundancyAndState) {
  std::string const rule = "array-degraded";
  EXPECT_THAT(Problems(rule, Array("MissingMembers = 0; State = \"clean\";")), IsEmpty());
  EXPECT_THAT(
      Problems(rule, Array("Members = 3; MissingMembers = 1; State = \"clean\"; PackageRedundancy = 0; Action = \"idle\";")),
      ElementsAre("critical: the RAID array md0 is degraded: 1 of 3 members is missing"));
  EXPECT_THAT(
      Problems(rule, Array("Members = 3; MissingMembers = 1; State = \"clean\"; PackageRedundancy = 1; Action = \"idle\";")),
      ElementsAre("error: the RAID array md0 is degraded: 1 of 3 members is missing"));
  EXPECT_THAT(
      Problems(rule, Array("Members = 3; MissingMembers = 1; State = \"clean\"; PackageRedundancy = 0; Action = \"recover\";")),
      ElementsAre("warning: the RAID array md0 is being rebuilt: 1 of 3 members is missing"));
}

// The kernel has the number of missing members only of arrays that run and have redundancy.
TEST(StorageRulesTest, AnArrayThatDoesNotRunIsCritical) {
  auto const problems = [](std::string const& state) { return Problems("array-degraded", Array(state)); };
  std::string const inactive = "State = \"inactive\"; ";
  auto const doesNotRun = ElementsAre("critical: the RAID array md0 does not run (inactive)");
  EXPECT_THAT(problems(inactive + "Level = \"raid5\";"), doesNotRun);
  EXPECT_THAT(problems(inactive + "MetadataVersion = \"1.2\";"), doesNotRun) << "the kernel has not read its level yet";
  EXPECT_THAT(problems(inactive + "Level = \"raid1\"; MetadataVersion = \"external:/md127/0\";"), doesNotRun);
  EXPECT_THAT(problems(inactive + "Level = \"container\"; MetadataVersion = \"external:ddf\";"), IsEmpty());
  EXPECT_THAT(problems(inactive + "MetadataVersion = \"external:ddf\";"), IsEmpty());
  EXPECT_THAT(problems("State = \"clear\"; MetadataVersion = \"none\"; Members = 0;"), IsEmpty()) << "a name without an array";
  EXPECT_THAT(problems("Level = \"raid0\"; State = \"broken\";"),
              ElementsAre("critical: the RAID array md0 is broken: it has lost more members than it can do without"));
  EXPECT_THAT(problems("Level = \"raid1\"; State = \"broken\"; MissingMembers = 2;"), testing::SizeIs(1));
}

TEST(StorageRulesTest, AnArrayWithoutRedundancyCannotLackAMember) {
  std::string const array = Array("Level = \"raid0\"; State = \"clean\";") +
                            Missing("ZEP_RaidArray.DeviceID=\\\"md0\\\"", "MissingMembers", "not-applicable");
  auto const result = ResultOf("array-degraded", FindingsOf(array));
  EXPECT_EQ(NameOf(result.fOutcome), "fine");
  EXPECT_THAT(result.fNotAsked, IsEmpty());
}

// ---- File systems ----

std::string FileSystem(std::string const& type, std::string const& size, std::string const& free, std::string const& more = "") {
  return "instance of CIM_UnixLocalFileSystem { Name = \"/dev/sda1\"; Root = \"/data\"; FileSystemType = \"" + type +
         "\"; FileSystemSize = " + size + "; AvailableSpace = " + free + "; " + more + " };";
}

TEST(StorageRulesTest, AFileSystemIsNearlyFullByPercentAndBySize) {
  std::string const rule = "file-system-full";
  EXPECT_THAT(Problems(rule, FileSystem("ext4", "100000000000", "9000000000")),
              ElementsAre("warning: the file system on /data is nearly full: 9 % free"));
  EXPECT_THAT(Problems(rule, FileSystem("ext4", "100000000000", "10000000000")), IsEmpty());
  EXPECT_THAT(Problems(rule, FileSystem("xfs", "10000000000000", "500000000000")), IsEmpty()) << "500 GB are enough";
  EXPECT_THAT(Problems(rule, FileSystem("ext4", "100000000000", "0")), ElementsAre("error: the file system on /data is full"));
  EXPECT_THAT(Problems(rule, FileSystem("ext4", "3000000000000", "20000000000")),
              ElementsAre("error: the file system on /data has less than 1 % free"));
  EXPECT_THAT(Problems(rule, FileSystem("squashfs", "100000000", "0")), IsEmpty()) << "an image is always full";
  EXPECT_THAT(Problems(rule, FileSystem("ext4", "100000000000", "0", "ReadOnly = true;")), IsEmpty());
  TThresholds thresholds;
  thresholds.fFileSystemFreePercent = 5;
  EXPECT_THAT(Problems(rule, FileSystem("ext4", "100000000000", "9000000000"), thresholds), IsEmpty());
}

TEST(StorageRulesTest, AFileSystemThatIsNotMountedIsNotJudged) {
  EXPECT_EQ(Outcome("file-system-full", R"(instance of CIM_LocalFileSystem { Name = "/dev/sdb1"; FileSystemType = "ext4"; };)"),
            "fine");
}

TEST(StorageRulesTest, AFileSystemWithoutInodesIsNamed) {
  std::string const rule = "file-system-inodes";
  EXPECT_THAT(Problems(rule, FileSystem("ext4", "9", "9", "TotalInodes = 1000; FreeInodes = 49;")),
              ElementsAre("warning: the file system on /data has nearly no room for further files: 4 % of its inodes free"));
  EXPECT_THAT(Problems(rule, FileSystem("ext4", "9", "9", "TotalInodes = 1000; FreeInodes = 50;")), IsEmpty());
  EXPECT_THAT(Problems(rule, FileSystem("btrfs", "9", "9", "TotalInodes = 0; FreeInodes = 0;")), IsEmpty());
  EXPECT_THAT(Problems(rule, FileSystem("ext4", "9", "9", "ReadOnly = true; TotalInodes = 1000; FreeInodes = 0;")), IsEmpty());
}

std::string Mount(std::string const& type, std::string const& options, std::string const& ofSystem) {
  return "instance of ZEP_Mount { InstanceID = \"1\"; ElementName = \"/data\"; Type = \"" + type + "\"; Options = \"" + options +
         "\"; FileSystemOptions = \"" + ofSystem + "\"; };";
}

TEST(StorageRulesTest, AFileSystemThatBecameReadOnlyIsAnError) {
  std::string const rule = "file-system-read-only";
  EXPECT_THAT(Problems(rule, Mount("ext4", "rw,noatime", "ro,errors=remount-ro")),
              ElementsAre("error: the file system on /data has become read-only"));
  EXPECT_THAT(Problems(rule, Mount("ext4", "ro,noatime", "ro")), IsEmpty()) << "mounted so on purpose";
  EXPECT_THAT(Problems(rule, Mount("ext4", "rw", "rw,errors=remount-ro")), IsEmpty());
  EXPECT_THAT(Problems(rule, Mount("squashfs", "rw", "ro")), IsEmpty());
  EXPECT_THAT(Problems(rule, Mount("overlay", "rw,relatime", "ro,lowerdir=/l/A:/l/B")), IsEmpty()) << "a mounted image";
  EXPECT_THAT(Problems(rule, Mount("overlay", "rw,relatime", "ro,lowerdir=/l/A,upperdir=/u,workdir=/w")), testing::SizeIs(1));
}

}  // namespace
}  // namespace NQRVZEP20
