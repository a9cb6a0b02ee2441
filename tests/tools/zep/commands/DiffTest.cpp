// SPDX-License-Identifier: Apache-2.0

// zep diff, and zep report with a stored report or a page.

#include "tests/collect/stored/StoredDocument.h"
#include "tests/tools/zep/Zep.h"

#include <gmock/gmock.h>

namespace NQRVZEP20::zep {
namespace {

using testing::HasSubstr;

class DiffTest : public testing::Test {
protected:
  DiffTest() {
    Write("a.json", HealthyDocument());
    Write("cut.json", StoredDocument().substr(0, 900));
    TRun const run = fZep.Run({{"report", "--sample", "--json"}});
    Write("sample.json", run.fOutput);
  }

  void Write(std::string const& name, std::string const& text) { WriteFile(fZep.Path(name), text); }

  TRun Run(std::vector<std::string> const& arguments) {
    TCall call = {arguments};
    call.fDirectory = fZep.Path("");
    return fZep.Run(call);
  }

  TInstallation fZep;
};

TEST_F(DiffTest, AMemoryModuleThatIsGoneIsOneLine) {
  auto document = nlohmann::json::parse(ReadFile(fZep.Path("sample.json")));
  auto& instances = document["instances"];
  for (auto at = instances.begin(); at != instances.end(); ++at)
    if ((*at)["class"] == "CIM_PhysicalMemory") {
      instances.erase(at);
      break;
    }
  Write("later.json", document.dump());
  TRun const run = Run({"diff", "sample.json", "later.json"});
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(run.fOutput, "gone: CIM_PhysicalMemory CPU 1 DIMM 1 (16 GiB, Example Works, EW16R32-D4, EX4100073)\n");
}

TEST_F(DiffTest, TheSameMachineHasNoDifferencesLater) {
  TRun const run = Run({"report", "--sample", "--since", "sample.json"});
  EXPECT_EQ(run.fStatus, 0) << run.fErrors;
  EXPECT_EQ(run.fOutput, "no differences\n");
}

// The name of a file may contain a secret.
TEST_F(DiffTest, AComparisonOfRedactedReportsDoesNotNameTheirFiles) {
  std::string const redacted = "\"redaction\": {\"map\": \"0123456789abcdef\", \"kinds\": [\"hosts\"]}, \"status\"";
  Write("db1-a.json", WithReplaced(StoredDocument(), "\"status\"", redacted));
  Write("db1-b.json", WithReplaced(HealthyDocument(), "\"status\"", redacted));
  TRun const run = Run({"diff", "db1-a.json", "db1-b.json", "--json", "--html", "page.html"});
  EXPECT_EQ(run.fStatus, 2) << run.fErrors;
  EXPECT_THAT(run.fOutput, HasSubstr("provider Disks failed in the earlier report: no disk"));
  EXPECT_THAT(run.fOutput, HasSubstr("\"file\": \"the later report\""));
  EXPECT_THAT(run.fOutput + ReadFile(fZep.Path("page.html")), testing::Not(HasSubstr("db1-")));
}

TEST_F(DiffTest, AnUnreadableReportIsRefusedByNameAndPlace) {
  TRun const cut = Run({"diff", "a.json", "cut.json"});
  EXPECT_EQ(cut.fStatus, 66);
  EXPECT_THAT(cut.fErrors, testing::StartsWith("zep: cut.json: line "));
  EXPECT_EQ(Run({"report", "--from", "none.json"}).fErrors, "zep: none.json: no such file\n");
  Write("newer.json", StoredDocumentWith("\"version\": 2", "\"version\": 3"));
  EXPECT_EQ(Run({"report", "--from", "newer.json", "--html", "page"}).fErrors,
            "zep: newer.json: /version: is 3, which a newer zep wrote; this zep reads version 2\n");
  EXPECT_FALSE(fs::exists(fZep.Path("page")));
}

TEST_F(DiffTest, AStoredReportIsPrintedOrWrittenAsAPage) {
  TRun const text = Run({"report", "--from", "a.json"});
  EXPECT_EQ(text.fStatus, 0);
  EXPECT_THAT(text.fOutput, HasSubstr("the disk sda is failing"));
  TRun const page = Run({"report", "--from", "a.json", "--html", "page"});
  EXPECT_EQ(page.fStatus, 0);
  EXPECT_EQ(page.fOutput, "");
  EXPECT_THAT(ReadFile(fZep.Path("page")), HasSubstr("<h1>db1: Server Q100</h1>"));
}

TEST_F(DiffTest, ThePageOfThisMachineIsThatOfItsDocument) {
  TRun const run = Run({"report", "--sample", "--html", "page", "--json"});
  EXPECT_EQ(run.fStatus, 0) << run.fErrors;
  EXPECT_TRUE(nlohmann::json::accept(run.fOutput));
  std::string const page = ReadFile(fZep.Path("page"));
  EXPECT_THAT(page, HasSubstr("SAMPLE sample-server: Server Q100"));
  EXPECT_THAT(page, HasSubstr("EX4100073"));
  EXPECT_LT(page.size(), 300000u);
  EXPECT_EQ(Run({"report", "--sample", "--html", "."}).fStatus, 73);
}

TEST_F(DiffTest, TheDifferencesCanBeAPage) {
  Write("b.json",
        WithReplaced(HealthyDocumentWith("17179869184", "34359738368"), "\"severity\": \"error\"", "\"severity\": \"warning\""));
  TRun const run = Run({"diff", "a.json", "b.json", "--html", "page"});
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(run.fOutput, "");
  EXPECT_THAT(ReadFile(fZep.Path("page")), HasSubstr("<ins>32 GiB</ins>"));
  EXPECT_THAT(Run({"diff", "a.json", "b.json", "--json"}).fOutput, HasSubstr("\"before\": \"error\""));
}

}  // namespace
}  // namespace NQRVZEP20::zep
