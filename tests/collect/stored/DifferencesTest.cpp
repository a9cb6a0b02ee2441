// SPDX-License-Identifier: Apache-2.0
#include "collect/stored/Differences.h"

#include "tests/Support.h"
#include "tests/collect/stored/StoredDocument.h"

namespace NQRVZEP20 {
namespace {

TStoredReport Before() { return StoredReportFrom(HealthyDocument(), "a.json"); }

TStoredReport With(std::string const& from, std::string const& to) {
  return StoredReportFrom(HealthyDocumentWith(from, to), "b.json");
}

// A report whose first instance is a sensor of that class with one reading.
TStoredReport WithProperty(std::string const& cls, std::string const& name, std::string const& value,
                           std::string const& more = "") {
  TStoredReport report = Before();
  TStoredInstance& instance = report.fInstances.front();
  instance.fClass = cls;
  instance.fProperties.push_back({name, "uint32", false, value, value, "", "", {}});
  if (!more.empty()) instance.fProperties.push_back({"Hysteresis", "uint32", false, more, more, "", "", {}});
  return report;
}

TEST(DifferencesTest, EqualReportsAreTheSame) {
  TDifferences const differences = DifferencesOf(Before(), Before());
  EXPECT_TRUE(differences.IsSame());
  EXPECT_TRUE(differences.fNotCompared.empty());
}

TEST(DifferencesTest, AnObjectThatIsGoneHasItsNameAndItsReverseAppeared) {
  TStoredReport const before = Before(), after = With("Tag=\\\"1\\\"", "Tag=\\\"7\\\"");
  TDifferences const differences = DifferencesOf(before, after);
  ASSERT_EQ(differences.fObjects.size(), 2u);
  EXPECT_EQ(NameOf(differences.fObjects[0].fKind), "gone");
  EXPECT_EQ(differences.fObjects[0].fName, "DIMM 1 (16 GiB)");
  EXPECT_EQ(differences.fObjects[0].fClass, "CIM_PhysicalMemory");
  EXPECT_EQ(NameOf(differences.fObjects[1].fKind), "appeared");
  EXPECT_EQ(differences.fObjects[1].fPath, "root/x:CIM_PhysicalMemory.Tag=\"7\"");
}

TEST(DifferencesTest, AChangeHasWordsAndUnits) {
  struct {
    char const *fFrom, *fTo, *fName, *fBefore, *fAfter;
  } const rows[] = {
      {"17179869184", "34359738368", "Capacity", "16 GiB", "32 GiB"},
      {"17179869184", "17179869185", "Capacity", "17179869184", "17179869185"},
      {"26, \"words\": \"DDR4\"", "34, \"words\": \"DDR5\"", "MemoryType", "DDR4", "DDR5"},
      {"\"value\": 1.25,", "\"value\": null, \"code\": \"x\", \"reason\": \"none\",", "Voltage", "1.25", "unknown (none)"},
  };
  for (auto const& row : rows) {
    TDifferences const differences = DifferencesOf(Before(), With(row.fFrom, row.fTo));
    ASSERT_EQ(differences.fObjects.size(), 1u) << row.fTo;
    ASSERT_EQ(differences.fObjects[0].fChanges.size(), 1u);
    EXPECT_EQ(differences.fObjects[0].fChanges[0].fName, row.fName);
    EXPECT_EQ(differences.fObjects[0].fChanges[0].fBefore, row.fBefore);
    EXPECT_EQ(differences.fObjects[0].fChanges[0].fAfter, row.fAfter);
  }
}

TEST(DifferencesTest, RowsAndProblemsAreCompared) {
  TDifferences const rows = DifferencesOf(Before(), With("\"value\": \"db1\"", "\"value\": \"db2\""));
  ASSERT_EQ(rows.fRows.size(), 1u);
  EXPECT_EQ(rows.fRows[0].fName, "Host name");
  EXPECT_EQ(rows.fRows[0].fAfter, "db2");
  TStoredReport healthy = Before();
  healthy.fProblems.clear();
  healthy.fRules[0].fNotExamined.clear();
  EXPECT_EQ(DifferencesOf(healthy, Before()).fNewProblems.at(0).fRule, "disk-failing");
  EXPECT_EQ(DifferencesOf(Before(), healthy).fSolvedProblems.at(0).fRule, "disk-failing");
  EXPECT_TRUE(DifferencesOf(Before(), With("sda is failing", "sda is failing for 7 hours")).IsSame());
  EXPECT_TRUE(DifferencesOf(Before(), With("\"reason\": \"needs root\"", "\"reason\": \"took 5 s\"")).IsSame());
}

TEST(DifferencesTest, AProblemWhoseSeverityChangesIsNeitherNewNorSolved) {
  TStoredReport before = Before();
  before.fRules[0].fNotExamined.clear();
  TStoredReport after = before;
  after.fProblems[0].fSeverity = "warning";
  after.fProblems.push_back({"disk-failing", "error", "the disk sdb is failing", "", "root/x:X_Disk.Name=\"sdb\""});
  TDifferences const differences = DifferencesOf(before, after);
  EXPECT_FALSE(differences.IsSame());
  ASSERT_EQ(differences.fChangedProblems.size(), 1u);
  EXPECT_EQ(differences.fChangedProblems[0].fSeverityBefore, "error");
  EXPECT_EQ(differences.fChangedProblems[0].fProblem.fSeverity, "warning");
  ASSERT_EQ(differences.fNewProblems.size(), 1u);
  EXPECT_EQ(differences.fNewProblems[0].fReason, "the disk sdb is failing");
  EXPECT_TRUE(differences.fSolvedProblems.empty());
}

// Two problems of one cause are two.
TEST(DifferencesTest, EachProblemIsPairedOnce) {
  TStoredReport before = Before();
  before.fRules[0].fNotExamined.clear();
  TStoredReport after = before;
  after.fProblems[0].fSeverity = "warning";
  after.fProblems.push_back(after.fProblems[0]);
  TDifferences const differences = DifferencesOf(before, after);
  EXPECT_EQ(differences.fChangedProblems.size(), 1u);
  EXPECT_EQ(differences.fNewProblems.size(), 1u);
}

TEST(DifferencesTest, WithinWhatAlwaysChangesReportsAreTheSame) {
  struct {
    char const *fClass, *fProperty, *fBefore, *fAfter, *fHysteresis;
    bool fIsSame;
  } const rows[] = {
      {"ZEP_RunningState", "Uptime", "1", "2", "", true},
      {"ZEP_RunningState", "LoadOfOneMinute", "1", "2", "", true},
      {"CIM_OperatingSystem", "FreePhysicalMemory", "1", "2", "", true},
      {"ZEP_InterfaceStatistics", "BytesReceived", "1", "2", "", true},
      {"ZEP_InterfaceStatistics", "ReceiveErrors", "1", "2", "", false},
      {"CIM_NumericSensor", "CurrentReading", "40", "44", "", true},
      {"CIM_NumericSensor", "CurrentReading", "40", "45", "", false},
      {"CIM_NumericSensor", "CurrentReading", "40", "42", "2", true},
      {"CIM_NumericSensor", "CurrentReading", "40", "43", "2", false},
      {"CIM_NumericSensor", "CurrentState", "1", "2", "", false},
      {"ZEP_IPAddress", "ValidLifetime", "100", "40", "", true},
      {"ZEP_DiskHealth", "BytesWritten", "1", "2", "", true},
      {"ZEP_DiskHealth", "Temperature", "40", "41", "", true},
      {"ZEP_DiskHealth", "Temperature", "40", "50", "", false},
      {"ZEP_DiskHealth", "ReallocatedSectors", "1", "2", "", false},
      {"ZEP_SmartAttribute", "RawValue", "1", "2", "", true},
      {"ZEP_SmartAttribute", "WhenFailed", "1", "2", "", false},
      {"ZEP_KernelLog", "CurrentNumberOfRecords", "1", "2", "", true},
      {"ZEP_SwapArea", "Used", "1", "2", "", true},
      {"ZEP_SwapArea", "Size", "1", "2", "", false},
      {"ZEP_RaidArray", "Progress", "1", "2", "", true},
      {"ZEP_RaidArray", "FailedMembers", "1", "2", "", false},
      {"CIM_OperatingSystem", "SizeStoredInPagingFiles", "1", "2", "", false},
      {"ZEP_MissingValue", "Reason", "1", "2", "", true},
  };
  for (auto const& row : rows) {
    TStoredReport const before = WithProperty(row.fClass, row.fProperty, row.fBefore, row.fHysteresis),
                        after = WithProperty(row.fClass, row.fProperty, row.fAfter, row.fHysteresis);
    EXPECT_EQ(DifferencesOf(before, after).IsSame(), row.fIsSame) << row.fProperty << " " << row.fAfter;
    EXPECT_EQ(DifferencesOf(after, before).IsSame(), row.fIsSame) << row.fProperty << " " << row.fAfter << ", reversed";
  }
}

TEST(DifferencesTest, RelationsAreNotCompared) {
  EXPECT_TRUE(DifferencesOf(Before(), With("CIM_Realizes.A", "CIM_Realizes.B")).IsSame());
}

TEST(DifferencesTest, ObjectsOfAProviderThatFailedAreNotCompared) {
  TStoredReport failed = Before();
  failed.fFile = "b.json";
  failed.fInstances.clear();
  failed.fProviders[0].fError = "no table";
  for (bool const isReverse : {false, true}) {
    TDifferences const differences = isReverse ? DifferencesOf(failed, Before()) : DifferencesOf(Before(), failed);
    EXPECT_TRUE(differences.IsSame());
    EXPECT_EQ(differences.fNotCompared, (std::vector<std::string>{"provider Host failed in b.json: no table"}));
  }
  failed.fProviders.clear();
  EXPECT_EQ(DifferencesOf(Before(), failed).fNotCompared.at(0), "provider Host does not exist in b.json");
}

TEST(DifferencesTest, TheObjectsOfAPathAreComparedOneByOne) {
  TStoredReport before = Before();
  before.fInstances.push_back(before.fInstances[0]);
  TStoredReport after = before;
  EXPECT_TRUE(DifferencesOf(before, after).IsSame());
  after.fInstances.back().fProperties[2].fRaw = "1";
  EXPECT_EQ(DifferencesOf(before, after).fObjects.size(), 1u);
  after.fInstances.pop_back();
  ASSERT_EQ(DifferencesOf(before, after).fObjects.size(), 1u);
  EXPECT_EQ(NameOf(DifferencesOf(before, after).fObjects[0].fKind), "gone");
}

// ---- What a report could not examine ----

// The report without its memory modules, and why.
TStoredReport WithoutModules(std::string const& code, std::string const& reason) {
  TStoredReport report = Before();
  report.fFile = "b.json";
  TStoredInstance why{"root/x:ZEP_MissingValue.A=1", "Host", "root/x", "ZEP_MissingValue", {}};
  why.fProperties = {{"ElementPath", "string", true, "CIM_PhysicalMemory", "CIM_PhysicalMemory", "", "", {}},
                     {"ElementProperty", "string", true, "", "", "", "", {}},
                     {"Code", "string", false, code, code, "", "", {}},
                     {"Reason", "string", false, reason, reason, "", "", {}}};
  report.fInstances = {why, report.fInstances.back()};
  return report;
}

void ExpectNotCompared(TStoredReport const& before, TStoredReport const& after, std::string const& why) {
  for (bool const isReverse : {false, true}) {
    TDifferences const differences = isReverse ? DifferencesOf(after, before) : DifferencesOf(before, after);
    EXPECT_TRUE(differences.IsSame()) << why;
    EXPECT_EQ(differences.fNotCompared, std::vector<std::string>{why});
  }
}

TEST(DifferencesTest, ObjectsWhoseSourceCouldNotBeReadAreNotGone) {
  for (char const* const code : {"needs-root", "no-smbios", "unreadable", "no-source", "an-own-code"})
    ExpectNotCompared(Before(), WithoutModules(code, "only root may"), "b.json has no CIM_PhysicalMemory: only root may");
}

TEST(DifferencesTest, ObjectsThatTheSourceDoesNotListAreGone) {
  for (char const* const code : {"not-given", "not-applicable"}) {
    TDifferences const differences = DifferencesOf(Before(), WithoutModules(code, "none"));
    EXPECT_EQ(differences.fObjects.size(), 2u) << code;
    EXPECT_TRUE(differences.fNotCompared.empty()) << code;
  }
}

// A report without its problem, in which the rule for it has that outcome.
TStoredReport Solved(std::string const& outcome, std::vector<TStoredNotExamined> const& notExamined = {}) {
  TStoredReport report = Before();
  report.fFile = "b.json";
  report.fProblems.clear();
  report.fRules[0].fOutcome = outcome;
  report.fRules[0].fNotExamined = notExamined;
  return report;
}

TEST(DifferencesTest, AProblemIsNeitherNewNorSolvedIfItsRuleCouldNotExamineIt) {
  std::string const problem = "problem \"the disk sda is failing\": ", disk = Before().fProblems[0].fInstance;
  ExpectNotCompared(Before(), Solved("not-asked", {{"", "needs root"}}),
                    problem + "the rule disk-failing could not examine it in b.json: needs root");
  ExpectNotCompared(Before(), Solved("not-asked"), problem + "the rule disk-failing could not be asked in b.json");
  ExpectNotCompared(Before(), Solved("fine", {{"other", "no"}, {disk, "it sleeps"}}),
                    problem + "the rule disk-failing could not examine it in b.json: it sleeps");
  TStoredReport without = Solved("fine");
  without.fRules.clear();
  ExpectNotCompared(Before(), without, problem + "the rule disk-failing does not exist in b.json");
  EXPECT_EQ(DifferencesOf(Before(), Solved("fine", {{"other", "no"}})).fSolvedProblems.size(), 1u);
}

TEST(DifferencesTest, AProblemOfAnObjectThatAFailedProviderDescribedIsNotSolved) {
  TStoredReport before = Before(), after = Solved("fine");
  before.fProblems[0].fInstance = before.fInstances[0].fPath;
  EXPECT_EQ(DifferencesOf(before, after).fSolvedProblems.size(), 1u);
  after.fInstances.clear();
  after.fProviders[0].fError = "no table";
  TDifferences const differences = DifferencesOf(before, after);
  EXPECT_TRUE(differences.IsSame());
  EXPECT_EQ(differences.fNotCompared,
            (std::vector<std::string>{"provider Host failed in b.json: no table",
                                      "problem \"the disk sda is failing\": provider Host failed in b.json: no table"}));
}

TEST(DifferencesTest, APlugInThatFailedInBothReportsIsNamed) {
  TStoredReport const report = StoredReportFrom(StoredDocument(), "a.json");
  EXPECT_EQ(DifferencesOf(report, report).fNotCompared, (std::vector<std::string>{"provider Disks failed in a.json: no disk"}));
}

}  // namespace
}  // namespace NQRVZEP20
