// SPDX-License-Identifier: Apache-2.0
#include "providers/storage/TRaidArray.h"

#include "tests/providers/storage/MachineTree.h"

namespace NQRVZEP20 {
namespace {

class TRaidArrayTest : public testing::Test {
protected:
  TRaidArrayTest() {
    fTree.AddBlockDevice("/sys/devices/virtual/block/md0", "9:0", "2048");
    Set("level", "raid1");
    Set("array_state", "clean");
    Set("raid_disks", "2");
    Set("degraded", "0");
    Set("layout", "0");
    Set("sync_action", "idle");
    Set("sync_completed", "none");
  }

  void Set(std::string const& file, std::string const& text) { fTree.Add(kDirectory + file, text + "\n"); }

  // The kernel has these files only while an array with redundancy runs.
  void RemoveFilesOfRedundancy() {
    for (char const* file : {"degraded", "sync_action", "sync_completed"}) fTree.Remove(kDirectory + file);
  }

  TRaidArray Array() const { return RaidArrayOf(fTree.fFiles, BlockDevicesOf(fTree.fFiles).at(0)); }

  std::string Value(char const* property) const {
    return LineOf(
        RaidArrayRecord(fTree.fFiles, Array(), TUdevRecord::From("E:MD_NAME=host:mirror\n"), TComputerSystem(fTree.fFiles)),
        property);
  }

  std::string const kDirectory = "/sys/devices/virtual/block/md0/md/";
  TMachineTree fTree;
};

TEST_F(TRaidArrayTest, Redundancy) {
  struct TRow {
    char const *fLevel, *fDisks, *fDegraded, *fLayout, *fRedundancy, *fCopies;
  };
  TRow const rows[] = {
      {"raid1", "3", "0", "0", "2", "3"},    {"raid1", "2", "1", "0", "0", "1"},      {"raid4", "3", "0", "0", "1", "1"},
      {"raid5", "4", "1", "2", "0", "1"},    {"raid6", "5", "1", "2", "1", "1"},      {"raid6", "5", "3", "2", "0", "1"},
      {"raid10", "4", "0", "258", "1", "2"}, {"raid10", "4", "1", "0x202", "2", "3"}, {"raid10", "4", "1", "258", "0", "1"},
  };
  for (TRow const& row : rows) {
    Set("level", row.fLevel);
    Set("raid_disks", row.fDisks);
    Set("degraded", row.fDegraded);
    Set("layout", row.fLayout);
    EXPECT_EQ(Value("PackageRedundancy"), row.fRedundancy) << row.fLevel;
    EXPECT_EQ(Value("DataRedundancy"), row.fCopies) << row.fLevel;
  }
}

TEST_F(TRaidArrayTest, StatesAreStatuses) {
  struct TRow {
    char const *fState, *fDegraded, *fAction, *fStatus, *fTexts, *fExtentStatus;
  };
  TRow const rows[] = {
      {"clean", "0", "idle", "{ 2 }", "{ clean }", "{ 2 }"},
      {"active", "1", "recover", "{ 3, 11 }", "{ active, degraded: 1 of 2 members missing, recover }", "{ 9, 11 }"},
      {"active", "0", "check", "{ 2, 11 }", "{ active, check }", "{ 14 }"},
      {"active", "0", "resync", "{ 2, 11 }", "{ active, resync }", "{ 12 }"},
      {"active", "0", "reshape", "{ 2, 11 }", "{ active, reshape }", "{ 5 }"},
      {"broken", "2", "frozen", "{ 6 }", "{ broken }", "{ 3, 9 }"},
  };
  for (TRow const& row : rows) {
    Set("array_state", row.fState);
    Set("degraded", row.fDegraded);
    Set("sync_action", row.fAction);
    EXPECT_EQ(Value("OperationalStatus"), row.fStatus) << row.fState;
    EXPECT_EQ(Value("StatusDescriptions"), row.fTexts) << row.fState;
    EXPECT_EQ(Value("ExtentStatus"), row.fExtentStatus) << row.fState;
  }
}

TEST_F(TRaidArrayTest, AnArrayThatDoesNotRunHasNoNumberOfMissingMembers) {
  RemoveFilesOfRedundancy();
  Set("array_state", "inactive");
  EXPECT_EQ(Value("OperationalStatus"), "{ 10 }");
  EXPECT_EQ(Value("StatusDescriptions"), "{ inactive }");
  EXPECT_EQ(Value("ExtentStatus"), "{ 2 }");
  for (char const* property : {"MissingMembers", "PackageRedundancy", "NoSinglePointOfFailure", "DataRedundancy"})
    EXPECT_EQ(Value(property), "</sys/devices/virtual/block/md0/md/degraded does not exist>") << property;
}

TEST_F(TRaidArrayTest, AnArrayWithoutRedundancyCannotLackAMember) {
  RemoveFilesOfRedundancy();
  for (std::string const level : {"raid0", "linear"}) {
    Set("level", level);
    EXPECT_EQ(Value("MissingMembers"), "<an array of the level " + level + " has no redundancy: it cannot lack a member>");
    EXPECT_EQ(Value("PackageRedundancy"), "0");
    EXPECT_EQ(Value("DataRedundancy"), "1");
    EXPECT_EQ(Value("OperationalStatus"), "{ 2 }");
  }
  Set("array_state", "broken");
  EXPECT_EQ(Value("OperationalStatus"), "{ 6 }");
  EXPECT_EQ(Value("ExtentStatus"), "{ 3 }");
}

TEST_F(TRaidArrayTest, Progress) {
  struct TRow {
    char const *fText, *fProgress;
  };
  TRow const rows[] = {{"none", "<the array is not being synchronised>"},
                       {"50 / 200", "25"},
                       {"200 / 200", "100"},
                       {"201 / 200", "<\"201 / 200\" is not the progress of a synchronisation>"},
                       {"1 / 0", "<\"1 / 0\" is not the progress of a synchronisation>"},
                       {"delayed", "<\"delayed\" is not the progress of a synchronisation>"}};
  for (TRow const& row : rows) EXPECT_EQ(TextOf(ProgressFrom(row.fText)), row.fProgress);
}

TEST_F(TRaidArrayTest, Members) {
  Set("dev-sda1/state", "in_sync");
  Set("dev-sda1/slot", "0");
  Set("dev-sda1/errors", "3");
  Set("dev-sda1/offset", "2048");
  Set("dev-sda1/size", "1000");
  Set("dev-sdb1/state", "faulty");
  Set("dev-sdb1/slot", "none");
  Set("dev-sdc1/state", "spare");
  TRaidArray const array = Array();
  ASSERT_EQ(array.fMembers.size(), 3u);
  EXPECT_THAT(LinesOf(RaidMemberRecord(array.fMembers[0])),
              ElementsAre("InstanceID=ZEP:raid:md0:sda1", "ElementName=sda1", "Array=md0", "State=in_sync", "Slot=0", "Errors=3",
                          "DataOffset=1048576", "DataSize=1024000"));
  EXPECT_EQ(LineOf(RaidMemberRecord(array.fMembers[1]), "Slot"),
            "<the device has no place in the array: it failed, or is a spare>");
  EXPECT_EQ(Value("FailedMembers"), "1");
  EXPECT_EQ(Value("SpareMembers"), "1");
}

TEST_F(TRaidArrayTest, NamesAndIdentifiers) {
  Set("uuid", "367bd78f-7b25-eb3a-4103-7dcadc6dfaec");
  Set("chunk_size", "0");
  EXPECT_EQ(Value("ElementName"), "host:mirror");
  EXPECT_EQ(Value("UUID"), "367bd78f:7b25eb3a:41037dca:dc6dfaec");
  EXPECT_EQ(Value("ChunkSize"), "<an array of this level has no chunks>");
  Set("uuid", "none");
  EXPECT_EQ(Value("UUID"), "<the metadata of the array have no UUID>");
}

TEST_F(TRaidArrayTest, AnArrayWithoutFilesHasReasons) {
  TRecord const record = RaidArrayRecord(fTree.fFiles, TRaidArray(), TUdevRecord(TMissing()), TComputerSystem(fTree.fFiles));
  for (TRecordProperty const& property : record.GetProperties()) EXPECT_FALSE(property.fName.empty());
  EXPECT_EQ(LineOf(record, "Mismatches"), "</sys/devices/none/none/md/mismatch_cnt does not exist>");
}

}  // namespace
}  // namespace NQRVZEP20
