// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/html/ReportHtml.h"

#include "tests/collect/stored/StoredDocument.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <regex>
#include <set>

namespace NQRVZEP20::zep {
namespace {

using testing::HasSubstr;
using testing::Not;

std::string PageOf(std::string const& document) { return ReportAsHtml(StoredReportFrom(document, "a.json")); }

// The first group of each match.
std::set<std::string> Matches(std::string const& text, std::string const& pattern) {
  std::set<std::string> found;
  std::regex const expression(pattern);
  for (std::sregex_iterator match(text.begin(), text.end(), expression), end; match != end; ++match) found.insert((*match)[1]);
  return found;
}

TEST(ReportHtmlTest, HasTheHeadTheFindingsAndEveryPart) {
  std::string const page = PageOf(StoredDocument());
  for (char const* part : {"<h1>db1: Server Q100</h1>", "Operating system: Debian 12", "2026-11-23 04:05:06 UTC",
                           "<p class=\"verdict error\">1 error</p>", "the disk sda is failing", "Replace it.",
                           "Is a disk failing?", "unknown: needs root", ">16 GiB</td>", "unknown: the firmware gives none",
                           "failed: no disk", "<dt>Capacity</dt><dd>16 GiB</dd>", "<dt>MemoryType</dt><dd>DDR4</dd>"})
    EXPECT_THAT(page, HasSubstr(part));
}

TEST(ReportHtmlTest, HasNeitherScriptsNorReferencesToOtherFiles) {
  std::string const page = PageOf(StoredDocument());
  for (char const* part : {"<script", "<link", "<img", "src=", "url(", "@import", "http://", "https://", "<iframe"})
    EXPECT_THAT(page, Not(HasSubstr(part)));
}

TEST(ReportHtmlTest, EveryLinkOfTheContentsLeadsToAPart) {
  std::string const page = PageOf(StoredDocument());
  EXPECT_EQ(Matches(page, "href=\"#([^\"]*)\""), Matches(page, " id=\"([^\"]*)\""));
}

TEST(ReportHtmlTest, TheKeyOfASectionIsNotAnId) {
  std::string const page = PageOf(StoredDocumentWith(R"("key": "memory")", R"("key": "a b findings")"));
  for (std::string const& id : Matches(page, " id=\"([^\"]*)\"")) EXPECT_THAT(id, testing::MatchesRegex("[a-z0-9-]+"));
}

TEST(ReportHtmlTest, RelationsAndMissingValuesAreOmitted) {
  EXPECT_THAT(PageOf(StoredDocument()), Not(HasSubstr("CIM_Realizes")));
}

TEST(ReportHtmlTest, RowsAreInTheirNaturalOrder) {
  std::string const page = PageOf(StoredDocumentWith("\"DIMM 1\", \"16 GiB\"", "\"DIMM 10\", \"16 GiB\""));
  EXPECT_LT(page.find(">DIMM 2</th>"), page.find(">DIMM 10</th>"));
}

TEST(ReportHtmlTest, WithoutProblemsTheRulesThatWereNotAskedAreMentioned) {
  TStoredReport report = StoredReportFrom(StoredDocument(), "a.json");
  report.fProblems.clear();
  report.fRules[0].fOutcome = "fine";
  EXPECT_THAT(ReportAsHtml(report), HasSubstr("No problem was found</p>"));
  report.fRules[0].fOutcome = "not-asked";
  EXPECT_THAT(ReportAsHtml(report), HasSubstr("No problem was found by the rules that could be asked</p>"));
}

TEST(ReportHtmlTest, RulesWithNothingToExamineAreCountedApart) {
  std::string const wrong = R"("outcome": "wrong", "examined": 1)";
  EXPECT_THAT(PageOf(StoredDocument()), HasSubstr("1 rule asked, 0 had nothing to examine, 0 could not be asked"));
  std::string const idle = PageOf(StoredDocumentWith(wrong, R"("outcome": "fine", "examined": 0)"));
  EXPECT_THAT(idle, HasSubstr("0 rules asked, 1 had nothing to examine, 0 could not be asked"));
  EXPECT_THAT(idle, HasSubstr("nothing to examine</span>"));
  EXPECT_THAT(PageOf(StoredDocumentWith(wrong, R"("outcome": "fine", "examined": 1)")), HasSubstr("\"fine\">no</span>"));
}

TEST(ReportHtmlTest, MarkupInEveryTextOfTheDocumentIsShownAsText) {
  std::string const hostile = "<b onload=\\\"x\\\">";
  for (char const* text : {"\"db1\"", "db1: Server Q100", "sda is failing", "Replace it.", "needs root", "Memory modules", "Slot",
                           "DIMM 1", "\"Is a disk failing?", "no disk", "CIM_PhysicalMemory", "Capacity", "DDR4", "disk-failing",
                           "\"error\", \"problems\"", "SMBIOS"}) {
    std::string replaced = text;
    bool const isQuoted = replaced.front() == '"';
    replaced = isQuoted ? replaced.substr(0, 1) + hostile + replaced.substr(1) : hostile + replaced;
    std::string const page = PageOf(StoredDocumentWith(text, replaced));
    EXPECT_THAT(page, Not(HasSubstr("<b "))) << text;
    EXPECT_THAT(page, Not(HasSubstr("onload=\""))) << text;
  }
}

TEST(ReportHtmlTest, ATimeIsWrittenForPeople) {
  EXPECT_EQ(TimeText("2026-11-23T04:05:06Z"), "2026-11-23 04:05:06 UTC");
  EXPECT_EQ(TimeText(""), "at an unknown time");
}

}  // namespace
}  // namespace NQRVZEP20::zep
