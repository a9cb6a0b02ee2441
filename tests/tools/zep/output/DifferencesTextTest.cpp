// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/DifferencesText.h"

#include "tests/collect/stored/StoredDocument.h"

#include <gtest/gtest.h>

namespace NQRVZEP20::zep {
namespace {

TStoredReport Before() { return StoredReportFrom(HealthyDocument(), "a.json"); }

TStoredReport With(std::string const& from, std::string const& to) {
  return StoredReportFrom(HealthyDocumentWith(from, to), "b.json");
}

std::string TextOf(TStoredReport const& after) { return DifferencesAsText(DifferencesOf(Before(), after)); }

TEST(DifferencesTextTest, EachDifferenceIsOneLine) {
  EXPECT_EQ(TextOf(Before()), "no differences\n");
  EXPECT_EQ(TextOf(With("\"16 GiB\", \"source\"", "\"32 GiB\", \"source\"")), "changed: Memory: 16 GiB -> 32 GiB\n");
  EXPECT_EQ(TextOf(With("\"DDR4\"", "\"DDR4\\n\"")), "no differences\n") << "the word, not the value, differs";
  EXPECT_EQ(TextOf(With("26, \"words\": \"DDR4\"", "34, \"words\": \"DDR5\\u001b\"")),
            "changed: CIM_PhysicalMemory DIMM 1 (16 GiB): MemoryType: DDR4 -> DDR5\\x1b\n");
  TStoredReport gone = Before();
  gone.fInstances.erase(gone.fInstances.begin());
  gone.fProblems.clear();
  gone.fRules[0].fNotExamined.clear();
  EXPECT_EQ(TextOf(With("\"severity\": \"error\"", "\"severity\": \"warning\"")),
            "changed problem: error -> warning: the disk sda is failing\n");
  EXPECT_EQ(TextOf(gone), "solved problem: error: the disk sda is failing\ngone: CIM_PhysicalMemory DIMM 1 (16 GiB)\n");
}

TEST(DifferencesTextTest, TheDocumentHasBothSidesAndTheCounts) {
  TStoredReport gone = Before();
  gone.fInstances.erase(gone.fInstances.begin());
  TDifferences const differences = DifferencesOf(Before(), gone);
  EXPECT_EQ(CountsOf(differences), "1 gone");
  TJson const document = DifferencesAsJson("zep diff", kExitNothing, differences, Before(), gone);
  EXPECT_EQ(document["reason"], "the reports differ: 1 gone");
  EXPECT_EQ(document["before"], (TJson{{"file", "a.json"}, {"time", "2026-11-23T04:05:06Z"}}));
  EXPECT_EQ(document["objects"][0]["kind"], "gone");
  EXPECT_EQ(document["objects"][0]["path"], "root/x:CIM_PhysicalMemory.Tag=\"1\"");
}

TEST(DifferencesTextTest, TheDocumentHasBothSeveritiesOfAChangedProblem) {
  TStoredReport const after = With("\"severity\": \"error\"", "\"severity\": \"critical\"");
  TJson const document = DifferencesAsJson("zep diff", kExitNothing, DifferencesOf(Before(), after), Before(), after);
  EXPECT_EQ(document["reason"], "the reports differ: 1 changed problem");
  EXPECT_EQ(document["changedProblems"], TJson::array({{{"rule", "disk-failing"},
                                                        {"before", "error"},
                                                        {"after", "critical"},
                                                        {"reason", "the disk sda is failing"},
                                                        {"remedy", "Replace it."},
                                                        {"instance", "root/x:X_Disk.Name=\"sda\""}}}));
}

}  // namespace
}  // namespace NQRVZEP20::zep
