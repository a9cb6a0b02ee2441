// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/ReportJson.h"

#include "tests/collect/SamplePlugIns.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <stdexcept>

namespace NQRVZEP20::zep {
namespace {

TReport SampleReport() { return MakeReport(SamplePlugIns(), TheSample()); }

TEST(ReportJsonTest, IsWrittenInPieces) {
  TReport const report = SampleReport();
  TReportDocument const document(report, EMessages::kWithoutSecrets);
  std::vector<std::string> pieces;
  document.Write([&pieces](std::string const& piece) { pieces.push_back(piece); });
  EXPECT_GT(pieces.size(), 3u);
  std::string whole;
  for (std::string const& piece : pieces) whole += piece;
  EXPECT_EQ(whole, document.Text());

  TJson const json = TJson::parse(whole);
  std::size_t count = 0;
  for (TNamespaceView const& view : ViewsOf(report.fPlugIns)) count += view.AllInstances().size();
  EXPECT_EQ(json["instances"].size(), count);
  EXPECT_EQ(whole, AsText(json)) << "the form differs from that of other documents";
}

TEST(ReportJsonTest, TheLinesHaveTheDocumentThenEachInstanceThenTheirNumber) {
  TReport const report = SampleReport();
  TReportDocument const document(report, EMessages::kWithoutSecrets);
  std::vector<TJson> lines;
  document.WriteLines([&lines](std::string const& line) {
    EXPECT_EQ(line.find('\n'), line.size() - 1);
    lines.push_back(TJson::parse(line));
  });
  TJson whole = TJson::parse(document.Text());
  TJson const instances = whole["instances"];
  ASSERT_EQ(lines.size(), instances.size() + 2);
  for (std::size_t at = 0; at < instances.size(); ++at) EXPECT_EQ(lines[at + 1], instances[at]);
  EXPECT_EQ(lines.back(), (TJson{{"instances", instances.size()}, {"instanceFailures", TJson::array()}}));
  whole.erase("instances");
  EXPECT_EQ(lines.front(), whole);
}

TJson SectionOf(TJson const& document, std::string const& key) {
  for (TJson const& section : document["sections"])
    if (section["key"] == key) return section;
  return TJson::object();
}

TEST(ReportJsonTest, NoMessageOfAPlugInHasAPassword) {
  TReport report = SampleReport();
  char const* const message = "ftp://u:topsecret@h does not answer";
  TPlugIn failed{"Test", "/usr/lib/libTest.nsp.so", 0, message, {}};
  failed.fLastLogLine = failed.fWords = failed.fCause.fException = message;
  report.fPlugIns.push_back(failed);
  std::string const text = TReportDocument(report, EMessages::kWithoutSecrets).Text();
  EXPECT_THAT(text, testing::HasSubstr("ftp://u:***@h"));
  EXPECT_THAT(text, testing::Not(testing::HasSubstr("topsecret")));
}

TEST(ReportJsonTest, HasTheTablesOfTheTextReportAndTheUnits) {
  TReport const report = SampleReport();
  TJson const json = TJson::parse(TReportDocument(report, EMessages::kWithoutSecrets).Text());
  EXPECT_THAT(json["time"].get<std::string>(), testing::MatchesRegex("20[0-9-]{8}T[0-9:]{8}Z"));
  TJson const memory = SectionOf(json, "memory"), volumes = SectionOf(json, "volumes");
  EXPECT_EQ(memory["columns"][1], "Size");
  EXPECT_EQ(memory["rows"][0][1], "16 GiB");
  EXPECT_EQ(volumes["rows"], TJson::array());
  EXPECT_TRUE(volumes["whyEmpty"].is_string());
  for (TJson const& instance : json["instances"])
    if (instance["class"] == "CIM_PhysicalMemory") {
      EXPECT_EQ(instance["properties"]["Capacity"]["unit"], "byte");
    }
}

TEST(ReportJsonTest, AMemberThatWasAddedIsWritten) {
  TReport const report = SampleReport();
  TReportDocument document(report, EMessages::kVerbatim);
  document.Members()["sent"] = "yes";
  EXPECT_EQ(TJson::parse(document.Text())["sent"], "yes");
}

TEST(ReportJsonTest, AReportWithoutInstancesHasAnEmptyArray) {
  TReport const report = MakeReport({}, TheSample());
  TReportDocument const document(report, EMessages::kWithoutSecrets);
  EXPECT_THAT(document.Text(), testing::HasSubstr("\"instances\": []"));
}

TEST(ReportJsonTest, AFailureOfTheOutputIsNotTakenForOneOfANamespace) {
  TReport const report = SampleReport();
  TReportDocument const document(report, EMessages::kWithoutSecrets);
  int pieces = 0;
  auto const write = [&pieces](std::string const&) {
    if (++pieces == 2) throw std::runtime_error("the disk is full");
  };
  EXPECT_THROW(document.Write(write), std::runtime_error);
  EXPECT_EQ(pieces, 2);
}

}  // namespace
}  // namespace NQRVZEP20::zep
