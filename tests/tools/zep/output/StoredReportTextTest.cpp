// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/StoredReportText.h"

#include "tests/collect/stored/StoredDocument.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace NQRVZEP20::zep {
namespace {

TEST(StoredReportTextTest, HasTheHeadTheProblemsTheRowsAndTheTables) {
  std::string const text = StoredReportAsText(StoredReportFrom(StoredDocument(), "a.json"));
  EXPECT_THAT(text, testing::StartsWith("db1: Server Q100\nOperating system: Debian 12\n\nFindings"));
  for (char const* part :
       {"the disk sda is failing. Replace it.", "Host name", "unknown: needs root", "Memory modules\n", "DIMM 2"})
    EXPECT_THAT(text, testing::HasSubstr(part));
}

TEST(StoredReportTextTest, TheTitleOfASectionDoesNotReachTheTerminalRaw) {
  std::string const document = StoredDocumentWith(R"("title": "Memory modules")", R"("title": "Disks\u001b]0;own\u0007\u202e")");
  std::string const text = StoredReportAsText(StoredReportFrom(document, "a.json"));
  EXPECT_THAT(text, testing::HasSubstr(R"(Disks\x1b]0;own\x07\u202e)"));
  EXPECT_THAT(text, testing::Not(testing::HasSubstr("\x1b")));
}

// With the words of a report on this machine.
TEST(StoredReportTextTest, SaysWhichRulesHadNothingToExamine) {
  std::string const idle = StoredDocumentWith(R"("outcome": "wrong", "examined": 1,)", R"("outcome": "fine", "examined": 0,)");
  TReportParts const parts = {{"findings"}, false};
  EXPECT_THAT(StoredReportAsText(StoredReportFrom(idle, "a.json"), parts),
              testing::ContainsRegex("Rule +Question +Answer *\ndisk-failing +Is a disk failing\\? +nothing to examine"));
  EXPECT_THAT(StoredReportAsText(StoredReportFrom(StoredDocument(), "a.json"), parts),
              testing::ContainsRegex("disk-failing +Is a disk failing\\? +wrong"));
}

}  // namespace
}  // namespace NQRVZEP20::zep
