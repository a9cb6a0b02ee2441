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
      {"\"value\": 1.25,", "\"value\": null, \"code\": \"not-given\", \"reason\": \"none\",", "Voltage", "1.25",
       "unknown (none)"},
      {"\"DIMM 1\", \"source\"", "\"\", \"source\"", "ElementName", "DIMM 1", "\"\""},
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

TEST(DifferencesTest, ValuesThatAlwaysChangeAreNotCompared) {
  TStoredReport before = Before(), after = Before();
  before.fInstances[0].fProperties.push_back({"Uptime", "uint64", false, "1", "1", "", "", {}});
  after.fInstances[0].fProperties.push_back({"Uptime", "uint64", false, "2", "2", "", "", {}});
  EXPECT_TRUE(DifferencesOf(before, after).IsSame());
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

// A class that has objects is described: those that are gone are gone.
TEST(DifferencesTest, AReasonForSomeObjectsOfAClassHidesNoOther) {
  TStoredReport after = WithoutModules("too-many", "only the first is described");
  after.fInstances.push_back(Before().fInstances[0]);
  TDifferences const differences = DifferencesOf(Before(), after);
  ASSERT_EQ(differences.fObjects.size(), 1u);
  EXPECT_EQ(differences.fObjects[0].fName, "DIMM 2");
}

TStoredReport WithUnreadValues(std::string const& code) {
  TStoredReport report = Before();
  report.fFile = "b.json";
  for (TStoredInstance& instance : report.fInstances)
    for (TStoredProperty& property : instance.fProperties)
      if (property.fName == "Voltage" || property.fName == "Removable") property.fMissing = {code, "needs root"};
  return report;
}

TEST(DifferencesTest, AValueWhoseSourceCouldNotBeReadHasNotChanged) {
  ExpectNotCompared(Before(), WithUnreadValues("needs-root"),
                    "b.json has no CIM_PhysicalMemory.Removable, CIM_PhysicalMemory.Voltage: needs root");
  EXPECT_EQ(DifferencesOf(Before(), WithUnreadValues("not-given")).fObjects.at(0).fChanges.size(), 2u);
  TStoredReport row = Before();
  row.fFile = "b.json";
  row.fIdentity[0].fAnswer = TAnswer<std::string>::Unknown({"unreadable", "it is closed"}, "");
  ExpectNotCompared(Before(), row, "b.json has no Host name: it is closed");
}

// The kernel uses less memory than the modules have.
TEST(DifferencesTest, RowsOfDifferentSourcesAreNotCompared) {
  TStoredReport after = Before();
  after.fFile = "b.json";
  after.fDetails[0].fAnswer = TAnswer<std::string>::Known("15.5 GiB", "/proc/meminfo");
  TDifferences const differences = DifferencesOf(Before(), after);
  EXPECT_TRUE(differences.IsSame());
  EXPECT_EQ(differences.fNotCompared,
            (std::vector<std::string>{"Memory is from SMBIOS in a.json, and from /proc/meminfo in b.json"}));
}

// A report with the record of a disk error, and a problem of it.
TStoredReport WithRecord(std::string const& time, std::string const& text) {
  TStoredReport report = Before();
  std::string const path = "root/x:ZEP_KernelLogRecord.MessageTimestamp=\"" + time + "\",RecordID=\"812\"";
  TStoredInstance record{path, "Host", "root/x", "ZEP_KernelLogRecord", {}};
  record.fProperties = {{"RecordID", "string", true, "812", "812", "", "", {}},
                        {"MessageTimestamp", "datetime", true, time, time, "", "", {}},
                        {"RecordData", "string", false, text, text, "", "", {}}};
  report.fInstances.push_back(record);
  report.fProblems = {{"disk-failing", "error", "the kernel logged an error of sda", "", path}};
  report.fRules[0].fNotExamined.clear();
  return report;
}

TEST(DifferencesTest, AClockThatWasCorrectedMakesNoNewRecordsAndProblems) {
  TStoredReport const before = WithRecord("20261123040506.000000+000", "I/O error, dev sda");
  EXPECT_TRUE(DifferencesOf(before, WithRecord("20261123040507.000000+000", "I/O error, dev sda")).IsSame());
  TDifferences const other = DifferencesOf(before, WithRecord("20261123040507.000000+000", "I/O error, dev sdb"));
  EXPECT_EQ(other.fObjects.size(), 2u);
  EXPECT_EQ(other.fNewProblems.size(), 1u);
  EXPECT_EQ(other.fSolvedProblems.size(), 1u);
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
