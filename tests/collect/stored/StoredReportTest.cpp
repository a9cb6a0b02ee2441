// SPDX-License-Identifier: Apache-2.0
#include "collect/stored/StoredReport.h"

#include "collect/stored/StoredDocument.h"
#include "tests/Support.h"
#include "tests/collect/stored/StoredDocument.h"

#include <sys/stat.h>

#include <ctime>

namespace NQRVZEP20 {
namespace {

std::string WhyRefused(std::function<void()> const& read) {
  try {
    read();
  } catch (TStoredReportError const& failure) {
    return failure.what();
  }
  return "";
}

std::string WhyTextRefused(std::string const& text) {
  return WhyRefused([&] { StoredReportFrom(text, "a.json"); });
}

std::string WhyFileRefused(std::string const& file) {
  return WhyRefused([&] { ReadStoredReport(file); });
}

TEST(StoredReportTest, HasTheHeadTheRowsAndTheFindings) {
  TStoredReport const report = StoredReportFrom(StoredDocument(), "a.json");
  EXPECT_EQ(report.fFile, "a.json");
  EXPECT_EQ(report.fTime, "2026-11-23T04:05:06Z");
  EXPECT_EQ(report.fHead, (std::vector<std::string>{"db1: Server Q100", "Operating system: Debian 12"}));
  EXPECT_EQ(report.fIdentity.at(0).fLabel, "Host name");
  EXPECT_EQ(report.fIdentity.at(1).fAnswer.fMissing.fReason, "needs root");
  EXPECT_EQ(*report.fDetails.at(0).fAnswer.fValue, "16 GiB");
  EXPECT_EQ(report.fProblems.at(0).fReason, "the disk sda is failing");
  EXPECT_EQ(report.fRules.at(0).fNotExamined.at(0).fReason, "needs root");
}

TEST(StoredReportTest, HasTheTablesAndTheProviders) {
  TStoredReport const report = StoredReportFrom(StoredDocument(), "a.json");
  EXPECT_EQ(*report.fSections.at(0).fRows.at(0).at(1).fValue, "16 GiB");
  EXPECT_EQ(report.fSections.at(0).fRows.at(1).at(1).fMissing.fCode, "not-given");
  ASSERT_EQ(report.fProviders.size(), 2u);
  EXPECT_EQ(report.fProviders[0].fMilliseconds, 2);
  EXPECT_EQ(report.fProviders[0].fError, "");
  EXPECT_EQ(report.fProviders[1].fError, "no disk");
}

TEST(StoredReportTest, AProviderWhoseInstancesCouldNotBeReadHasFailed) {
  TStoredReport const report = StoredReportFrom(
      StoredDocumentWith("\"instances\": [",
                         "\"instanceFailures\": [{\"provider\": \"Host\", \"error\": \"no more\"}],\n\"instances\": ["),
      "a.json");
  EXPECT_EQ(report.fProviders[0].fError, "no more");
}

TEST(StoredReportTest, ValuesHaveWordsAndUnits) {
  TStoredReport const report = StoredReportFrom(StoredDocument(), "a.json");
  TStoredInstance const& module = report.fInstances.at(0);
  struct {
    char const *fName, *fText, *fRaw;
  } const rows[] = {{"Tag", "1", "1"},
                    {"Capacity", "16 GiB", "17179869184"},
                    {"MemoryType", "DDR4", "26"},
                    {"States", "OK, 9", "[2,9]"},
                    {"Removable", "true", "true"},
                    {"Voltage", "1.25", "1.25"}};
  for (auto const& row : rows) {
    ASSERT_NE(module.Find(row.fName), nullptr) << row.fName;
    EXPECT_EQ(module.Find(row.fName)->fText, row.fText);
    EXPECT_EQ(module.Find(row.fName)->fRaw, row.fRaw);
    EXPECT_TRUE(module.Find(row.fName)->IsKnown());
  }
  EXPECT_EQ(module.Find("None"), nullptr);
  EXPECT_EQ(report.fInstances.at(1).Find("Capacity")->fMissing.fReason, "the firmware gives none");
}

// The document has the digits of a double.
TEST(StoredReportTest, AReal32HasItsShortestText) {
  TStoredReport const report = StoredReportFrom(StoredDocumentWith("1.25", "3.299999952316284"), "a.json");
  EXPECT_EQ(report.fInstances[0].Find("Voltage")->fText, "3.3");
}

TEST(StoredReportTest, AnInstanceWhoseKeysAreReferencesIsAnAssociation) {
  TStoredReport const report = StoredReportFrom(StoredDocument(), "a.json");
  EXPECT_FALSE(report.fInstances.at(0).IsAssociation());
  EXPECT_TRUE(report.fInstances.at(2).IsAssociation());
}

TEST(StoredReportTest, ADocumentOfAnEarlierProgramMayLackTimeAndTables) {
  EXPECT_EQ(StoredReportFrom(StoredDocumentWith("\"time\"", "\"xtime\""), "a.json").fTime, "");
  EXPECT_TRUE(StoredReportFrom(StoredDocumentWith("\"sections\"", "\"xsections\""), "a.json").fSections.empty());
}

TEST(StoredReportTest, OfTwoMembersWithOneNameTheLastCounts) {
  EXPECT_EQ(StoredReportFrom(StoredDocumentWith("\"zep\"", "\"zep\": 7, \"zep\""), "a.json").fZep, "1.0.0");
}

// The spellings of secrets are of one report only.
TEST(StoredReportTest, AReportHasTheMapAndTheKindsOfItsRedaction) {
  std::string const redaction =
      "\"redaction\": {\"map\": \"0a\", \"kinds\": [\"hosts\"], \"spellings\": [{\"place\": \"/x\", \"letters\": [\"b\"]}]}, ";
  TStoredReport const report = StoredReportFrom(StoredDocumentWith("\"status\"", redaction + "\"status\""), "a.json");
  EXPECT_EQ(report.fRedaction, "0a [\"hosts\"]");
  EXPECT_EQ(StoredReportFrom(StoredDocument(), "a.json").fRedaction, "");
}

TEST(StoredReportTest, AChangedDocumentIsReadLikeItsText) {
  TStoredDocument document = StoredDocumentFrom(StoredDocument(), "a.json");
  document["head"][0] = "\"other\"";
  EXPECT_EQ(StoredReportOf(document, "a.json").fHead.at(0), "\"other\"");
  document["instances"][1]["properties"] = 7;
  EXPECT_EQ(WhyRefused([&] { StoredReportOf(document, "a.json"); }), "a.json: /instances/1/properties: is not an object");
}

TEST(StoredReportTest, AnAlteredDocumentIsRefusedWithThePlace) {
  struct {
    char const *fFrom, *fTo, *fReason;
  } const rows[] = {
      {"\"zep report\"", "\"zep show\"", "a.json: it is not a document of zep report --json"},
      {"\"document\"", "\"dokument\"", "a.json: it is not a document of zep report --json"},
      {"\"version\": 2", "\"version\": 3", "a.json: /version: is 3, which a newer zep wrote; this zep reads version 2"},
      {"\"version\": 2", "\"version\": 1", "a.json: /version: is 1, which an older zep wrote; this zep reads version 2"},
      {"\"version\": 2", "\"version\": -2", "a.json: /version: is not a number"},
      {"\"status\"", "\"x\"", "a.json: it has no report: "},
      {"\"complete\"", "\"finished\"", "a.json: /status: is a word that no report has"},
      {"\"head\": [\"db1", "\"head\": [1, \"db1", "a.json: /head/0: is not a string"},
      {"\"outcome\"", "\"x\"", "a.json: /findings/rules/0: has no member \"outcome\""},
      {"\"wrong\"", "\"so\"", "a.json: /findings/rules/0/outcome: is a word that no report has"},
      {"\"severity\": \"error\"", "\"severity\": \"fatal\"",
       "a.json: /findings/problems/0/severity: is a word that no report has"},
      {"\"DIMM 2\", {", "{", "a.json: /sections/0/rows/1: has not as many cells as the table has columns"},
      {"\"value\": \"17179869184\"", "\"value\": {}", "a.json: /instances/0/properties/Capacity/value: is not a value"},
      {"\"value\": [2, 9]", "\"value\": [2, []]", "a.json: /instances/0/properties/States/value/1: is not a value"},
      {"\"class\": \"CIM_Realizes\"", "\"class\": 7", "a.json: /instances/2/class: is not a string"},
      {"\"status\"", "\"redaction\": 5, \"status\"", "a.json: /redaction: is not an object"},
      {"\"status\"", "\"redaction\": {\"map\": 1, \"kinds\": []}, \"status\"", "a.json: /redaction/map: is not a string"},
      {"\"status\"", "\"redaction\": {\"map\": \"a\", \"kinds\": [\"hosts\", \"foo\"]}, \"status\"",
       "a.json: /redaction/kinds/1: is a word that no report has"},
      {"\"milliseconds\": 2", "\"milliseconds\": \"2\"", "a.json: /plugIns/1/milliseconds: is not a number"},
  };
  for (auto const& row : rows) EXPECT_EQ(WhyTextRefused(StoredDocumentWith(row.fFrom, row.fTo)), row.fReason) << row.fTo;
}

TEST(StoredReportTest, ACutDocumentIsRefusedAtEveryPlace) {
  std::string const text = StoredDocument();
  for (std::size_t size = 0; size < text.size(); size += 7)
    EXPECT_EQ(WhyTextRefused(text.substr(0, size)).rfind("a.json: line ", 0), 0u) << size;
}

TEST(StoredReportTest, ForeignBytesAreRefused) {
  EXPECT_EQ(WhyTextRefused("\x1f\x8b\x08"), "a.json: it is compressed; gunzip it first");
  EXPECT_EQ(WhyTextRefused("\"secret\n"),
            "a.json: line 2, column 0: syntax error while parsing value - invalid string: control character U+000A (LF) must be "
            "escaped to \\u000A or \\n");
  EXPECT_EQ(WhyTextRefused("{\"document\":\"zep report\",\"version\":2}\n{\"path\":\"x\"}\n"),
            "a.json: it has a line for each instance; this command reads the document of zep report --json");
  EXPECT_EQ(WhyTextRefused("{\"x\":1e999}"), "a.json: a number is too large");
  EXPECT_EQ(WhyTextRefused("[]"), "a.json: the document is not an object");
  EXPECT_EQ(WhyTextRefused("{}"), "a.json: it is not a document of zep report --json");
  EXPECT_EQ(WhyTextRefused("\x7f"
                           "ELF")
                .rfind("a.json: line 1, column 1: ", 0),
            0u);
  EXPECT_EQ(WhyTextRefused(StoredDocument() + "}").rfind("a.json: line ", 0), 0u);
  EXPECT_EQ(WhyTextRefused(StoredDocumentWith("db1", "\xff")).rfind("a.json: line 3, column ", 0), 0u);
}

TEST(StoredReportTest, DeepAndWideDocumentsAreRefusedWithoutCost) {
  EXPECT_EQ(WhyTextRefused(std::string(1000000, '[')), "a.json: the document is nested too deeply");
  std::string wide = "{";
  for (int at = 0; at < 100000; ++at) wide += "\"" + std::to_string(at) + "\":0,";
  EXPECT_EQ(WhyTextRefused(wide + "\"x\":0}"), "a.json: an object has more than 2000 members");
}

// The processor time in seconds to read a document with that many instances.
double TimeOfInstances(int count) {
  std::string text = "{\"document\": \"zep report\", \"version\": 2, \"instances\": [{}";
  for (int at = 0; at < count; ++at) text += ",{\"a\":0}";
  std::clock_t const start = std::clock();
  EXPECT_EQ(WhyTextRefused(text + "]}"), "a.json: the document has no member \"reason\"");
  return double(std::clock() - start) / CLOCKS_PER_SEC;
}

// With eight times the length, a quadratic parser would take 64 times the time. A busy machine may double any time.
TEST(StoredReportTest, ALongArrayTakesTimeInProportionToItsLength) {
  double const few = TimeOfInstances(20000), many = TimeOfInstances(160000);
  EXPECT_LT(many, 24 * few + 0.1) << few;
}

TEST(StoredReportTest, AFileThatIsNotAReportIsRefusedByItsName) {
  TTempDir const dir;
  EXPECT_EQ(WhyFileRefused("/nowhere"), "/nowhere: no such file");
  EXPECT_EQ(WhyFileRefused(dir.Path()), dir.Path() + ": it is not a regular file");
  ASSERT_EQ(::mkfifo(dir.Path("fifo").c_str(), 0600), 0);
  EXPECT_EQ(WhyFileRefused(dir.Path("fifo")), dir.Path("fifo") + ": it is not a regular file");
  WriteFile(dir.Path("long"), "");
  std::filesystem::resize_file(dir.Path("long"), kStoredReportLimit + 1);
  EXPECT_EQ(WhyFileRefused(dir.Path("long")), dir.Path("long") + ": it is longer than 64 MiB, the limit for a stored report");
  WriteFile(dir.Path("good"), StoredDocument());
  EXPECT_EQ(ReadStoredReport(dir.Path("good")).fFile, dir.Path("good"));
}

}  // namespace
}  // namespace NQRVZEP20
