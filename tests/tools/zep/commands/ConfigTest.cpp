// SPDX-License-Identifier: Apache-2.0

// zep config, run as users run it.

#include "tests/tools/zep/Zep.h"

#include <gtest/gtest.h>
#include <sys/stat.h>

namespace NQRVZEP20::zep {
namespace {

class ConfigTest : public testing::Test {
protected:
  TRun Run(std::vector<std::string> arguments, bool asNobody = false) {
    arguments.insert(arguments.begin(), "config");
    TCall call;
    call.fArguments = arguments;
    call.fDirectory = fDir.Path();
    call.fAsNobody = asNobody;
    return fZep.Run(call);
  }
  void Write(std::string const& text) { WriteFile(File(), text); }
  std::string File() const { return fDir.Path("zep.cfg"); }

  TInstallation fZep;
  TTempDir fDir;
};

std::string const kText =
    "# comment\n"
    "server=alpha=beta\n"
    "\n"
    "flag\n"
    "key = value \n"
    "server=gamma\n"
    "=no key\n"
    "empty=\n"
    "crlf=1\r\n"
    "a#b=c#d";

TEST_F(ConfigTest, ShowsTheSettingsWithTheirLinesAndTheIgnoredLinesWithTheReason) {
  Write(kText);
  TRun const run = Run({});
  EXPECT_EQ(run.fStatus, 0);
  EXPECT_EQ(run.fErrors, "");
  EXPECT_EQ(run.fOutput, File() +
                             "\n"
                             "\n"
                             "Line    Key                           Value\n"
                             "10      a#b                           c#d\n"
                             "9       crlf                          1\\x0d\n"
                             "4       flag                          flag\n"
                             "5       \"key \"                        \" value \"\n"
                             "2       server                        alpha=beta\n"
                             "\n"
                             "Line    Ignored                       Why\n"
                             "1       # comment                     a comment\n"
                             "3                                     an empty line\n"
                             "6       server=gamma                  line 2 already sets the key\n"
                             "7       =no key                       no key before \"=\"\n"
                             "8       empty=                        no value after \"=\"\n");
}

TEST_F(ConfigTest, ShowsOneSettingAndTheIgnoredLinesOfItsKey) {
  Write(kText);
  TRun const run = Run({"server"});
  EXPECT_EQ(run.fStatus, 0);
  EXPECT_EQ(run.fOutput, File() +
                             "\n"
                             "\n"
                             "Line    Key                           Value\n"
                             "2       server                        alpha=beta\n"
                             "\n"
                             "Line    Ignored                       Why\n"
                             "6       server=gamma                  line 2 already sets the key\n");
}

TEST_F(ConfigTest, PrintsJson) {
  Write("a=1\na=2\nflag\n");
  TRun const run = Run({"--json"});
  EXPECT_EQ(run.fStatus, 0);
  auto const document = JsonOf(run);
  EXPECT_EQ(document["version"], 2);
  EXPECT_EQ(document["file"], File());
  EXPECT_EQ(document["settings"], nlohmann::json::parse(R"([{"key": "a", "value": "1", "line": 1},
                                                            {"key": "flag", "value": "flag", "line": 3}])"));
  EXPECT_EQ(document["ignored"], nlohmann::json::parse(R"([{"line": 2, "text": "a=2",
                                                            "reason": "line 1 already sets the key"}])"));
}

TEST_F(ConfigTest, ReportsWhyThereAreNoSettings) {
  TRun run = Run({});
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(run.fOutput, "");
  EXPECT_EQ(run.fErrors, "zep: " + File() + " does not exist\n");

  Write("");
  run = Run({});
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(run.fErrors, "zep: " + File() + " is empty\n");

  Write("# comment\n");
  run = Run({});
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_NE(run.fOutput.find("a comment"), std::string::npos);
  EXPECT_EQ(run.fErrors, "zep: " + File() + " contains no settings\n");

  Write("a=1\n");
  run = Run({"b"});
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(run.fOutput, "");
  EXPECT_EQ(run.fErrors, "zep: " + File() + " does not set \"b\"\n");

  fs::permissions(fDir.Path(), fs::perms::all);
  fs::permissions(File(), fs::perms::none);
  run = Run({"--json"}, true);
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_TRUE(JsonOf(run)["settings"].empty());
  EXPECT_EQ(run.fErrors, "zep: " + File() + " cannot be read\n");
}

TEST_F(ConfigTest, APipeOfThatNameDoesNotBlock) {
  ASSERT_EQ(::mkfifo(File().c_str(), 0600), 0);
  TRun const run = Run({});
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(run.fErrors, "zep: " + File() + " is empty\n");
}

#ifdef FAILING_READ
TEST_F(ConfigTest, AFileThatCannotBeReadToItsEndIsReportedAsSuch) {
  std::string const text(100000, '#');
  Write("a=1\n" + text);
  TCall call;
  call.fArguments = {"config"};
  call.fDirectory = fDir.Path();
  call.fEnvironment = {{"LD_PRELOAD", FAILING_READ}, {"ZEP_TEST_FAILING_FILE", File()}, {"ZEP_TEST_FAILING_BYTE", "50000"}};
  TRun const run = fZep.Run(call);
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(run.fErrors, "zep: " + File() + " cannot be read to its end, so none of its settings is used\n");
}
#endif

TEST_F(ConfigTest, AcceptsOnlyOneKey) { EXPECT_EQ(Run({"a", "b"}).fStatus, 64); }

}  // namespace
}  // namespace NQRVZEP20::zep
