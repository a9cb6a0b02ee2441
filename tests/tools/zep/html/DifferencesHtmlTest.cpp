// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/html/DifferencesHtml.h"

#include "tests/collect/stored/StoredDocument.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace NQRVZEP20::zep {
namespace {

using testing::HasSubstr;

TEST(DifferencesHtmlTest, HasTheObjectsWithTheirChanges) {
  TStoredReport const before = StoredReportFrom(HealthyDocument(), "a.json"),
                      after = StoredReportFrom(HealthyDocumentWith("17179869184", "34359738368"), "b.json");
  std::string const page = DifferencesAsHtml(DifferencesOf(before, after), before, after);
  EXPECT_THAT(page, HasSubstr(">1 changed<"));
  EXPECT_THAT(page, HasSubstr("<dt>Capacity</dt><dd><del>16 GiB</del> \xe2\x86\x92 <ins>32 GiB</ins></dd>"));
  EXPECT_THAT(DifferencesAsHtml(DifferencesOf(before, before), before, before), HasSubstr(">No differences<"));
}

TEST(DifferencesHtmlTest, AChangedProblemHasBothSeverities) {
  TStoredReport const before = StoredReportFrom(HealthyDocument(), "a.json"),
                      after =
                          StoredReportFrom(HealthyDocumentWith("\"severity\": \"error\"", "\"severity\": \"warning\""), "b.json");
  EXPECT_THAT(
      DifferencesAsHtml(DifferencesOf(before, after), before, after),
      HasSubstr("<li class=\"warning\"><span class=\"severity\">error \xe2\x86\x92 warning</span><p class=\"what\">the disk sda "
                "is failing</p><p>Replace it.</p>"));
}

TEST(DifferencesHtmlTest, MarkupIsShownAsText) {
  TStoredReport const before = StoredReportFrom(HealthyDocument(), "a.json"),
                      after = StoredReportFrom(HealthyDocumentWith("DIMM 2", "<b>"), "b.json");
  EXPECT_THAT(DifferencesAsHtml(DifferencesOf(before, after), before, after), HasSubstr("<ins>&lt;b&gt;</ins>"));
}

}  // namespace
}  // namespace NQRVZEP20::zep
