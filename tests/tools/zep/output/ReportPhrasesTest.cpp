// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/ReportPhrases.h"

#include "tools/zep/output/ExitStatus.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace NQRVZEP20::zep {
namespace {

using testing::ElementsAre;
using TProcessors = std::vector<TProcessorKind>;

TEST(ReportPhrasesTest, ValuesArePutIntoWords) {
  struct TRow {
    TReportValue fValue;
    char const* fText;
  } const rows[] = {
      {"Server Q100", "Server Q100"},
      {TDate{2024, 3, 9}, "2024-03-09"},
      {TProcessors{{"Kind A", 1, 1}}, "1 x Kind A, 1 core"},
      {TProcessors{{"", 1, 4}, {"Kind A", 2, 20}, {"rare kind", 1, 2}},
       "2 x Kind A, 1 x processor of unknown kind, 1 x rare kind, 26 cores"},
      {TProcessors{{"Kind A", 2, 20}, {"Kind B", 1, std::nullopt}}, "2 x Kind A, 1 x Kind B"},
      {TMemorySize{std::uint64_t{128} << 30, 8, 0}, "128 GiB in 8 modules"},
      {TMemorySize{512 << 20, 1, 0}, "512 MiB in 1 module"},
      {TMemorySize{512 << 20, 0, 0}, "512 MiB, as the kernel uses it"},
      {TMemorySize{512 << 20, 2, 1}, "512 MiB in 2 modules, 1 of them of unknown size"},
  };
  for (TRow const& row : rows) EXPECT_EQ(ValueText(row.fValue), row.fText);
}

TReportRow Row(std::string const& key, std::string const& label, TReportAnswer const& answer) { return {key, label, answer}; }

TReport Report() {
  TReport report{};
  report.fCompleteness = ECompleteness::kPartial;
  auto const needsRoot = TReportAnswer::Unknown({"needs-root", "needs root"}, "");
  report.fIdentity = {Row("hostName", "Host name", TReportAnswer::Known("db1", "")),
                      Row("productName", "Product name", TReportAnswer::Known("Server Q100 -[1234AB7]-", "")),
                      Row("machineType", "Machine type", TReportAnswer::Known("1234", "")),
                      Row("model", "Model", needsRoot),
                      Row("serialNumber", "Serial number", needsRoot),
                      Row("osName", "OS", TReportAnswer::Known("Debian", "")),
                      Row("osVersion", "OS version", TReportAnswer::Unknown({"not-given", "no version"}, ""))};
  report.fPlugIns = {{"Broken", "libBroken.nsp.so", 0, "file too short", {}}};
  return report;
}

TEST(ReportPhrasesTest, TheHeadNamesTheMachineAndItsOperatingSystem) {
  TReport report = Report();
  EXPECT_THAT(HeadLines(report),
              ElementsAre("db1: Server Q100, type 1234, model unknown, serial number unknown", "Operating system: Debian"));
  report.fSample = TSample{"", "", "SAMPLE"};
  EXPECT_THAT(HeadLines(report), ElementsAre("SAMPLE db1: Server Q100, type 1234, model unknown, serial number unknown",
                                             "SAMPLE operating system of this machine, not of the sample: Debian"));
}

TEST(ReportPhrasesTest, AdjacentRowsShareTheirReason) {
  TReport report = Report();
  EXPECT_EQ(WhyNotComplete(report),
            "Model, Serial number: needs root; OS version: no version; Broken: file too short (libBroken.nsp.so)");
  report.fCompleteness = ECompleteness::kComplete;
  EXPECT_EQ(WhyNotComplete(report), "");
}

TEST(ReportPhrasesTest, TheCompletenessIsTheExitStatus) {
  EXPECT_EQ(ExitStatusOf(ECompleteness::kComplete), 0);
  EXPECT_EQ(ExitStatusOf(ECompleteness::kPartial), 2);
  EXPECT_EQ(ExitStatusOf(ECompleteness::kNothing), 1);
}

}  // namespace
}  // namespace NQRVZEP20::zep
