// SPDX-License-Identifier: Apache-2.0

// run-pages.sh, which runs the commands of pages, on pages of this test. scripts/pages runs it in bare trees.

#include "tests/Support.h"
#include "tests/os/Programs.h"

#include <gmock/gmock.h>

#include <filesystem>
#include <string>
#include <utility>
#include <vector>

namespace NQRVZEP20 {
namespace {

using testing::EndsWith;
using testing::HasSubstr;

class RunPagesTest : public testing::Test {
protected:
  RunPagesTest() { std::filesystem::create_directory(fDir.Path("place")); }

  // Runs the page in the directory "place".
  TProgramRun Run(std::string const& page, std::string const& reader = "source", std::string const& option = "") {
    WriteFile(fDir.Path("page.md"), page);
    WriteFile(fDir.Path("results"), "");
    return RunProgram("cd " + fDir.Path("place") + " && " + SourcePath("tests/system/bare/run-pages.sh") + " " + option + " " +
                      reader + " ../results .. page.md 2>&1");
  }

  std::string Results() const { return ReadFile(fDir.Path("results")); }
  bool Exists(std::string const& name) const { return std::filesystem::exists(fDir.Path("place/" + name)); }

  TTempDir fDir;
};

std::string Block(std::string const& info, std::string const& text) { return "```" + info + "\n" + text + "\n```\n"; }

TEST_F(RunPagesTest, TheCommandsOfAPageRunInOneShell) {
  TProgramRun const run =
      Run("# Page\n" + Block("sh", "cd /\nX='a b' \\\n  Y=c") + Block("console", "$ echo $X $Y $PWD\na b c /"));
  EXPECT_EQ(run.fExitCode, 0) << run.fOutput;
  EXPECT_THAT(Results(), testing::MatchesRegex("ran\tpage.md:3\t[0-9.]*\tcd /\n"
                                               "ran\tpage.md:4\t[0-9.]*\tX='a b' .\n  Y=c\n"
                                               "ran\tpage.md:8\t[0-9.]*\techo \\$X \\$Y \\$PWD\n"));
}

TEST_F(RunPagesTest, TheFirstFailingCommandEndsTheRun) {
  TProgramRun const run = Run(Block("sh", "# a comment\n\necho cause; false\ntouch later"));
  EXPECT_EQ(run.fExitCode, 1);
  EXPECT_THAT(run.fOutput, EndsWith("cause\npage.md:4: exit status 1 instead of 0: echo cause; false\n"));
  EXPECT_FALSE(Exists("later"));
}

TEST_F(RunPagesTest, TheCommentStatesTheExitStatus) {
  EXPECT_EQ(Run(Block("sh", "(exit 2)  # exit status 2")).fExitCode, 0);
  EXPECT_EQ(Run(Block("sh", "true  # exit status 2")).fExitCode, 1);
}

TEST_F(RunPagesTest, ACommandThatExitsIsAFailure) { EXPECT_EQ(Run(Block("sh", "exit 0\ntouch later")).fExitCode, 1); }

TEST_F(RunPagesTest, TheOutputIsComparedWithThePage) {
  struct TCase {
    char const *fPrinted, *fShown;
    bool fIsSame;
  };
  for (TCase const& c :
       {TCase{"a\\nb", "a\nb", true}, TCase{"a\\nb", "a", false}, TCase{"a", "a\nb", false}, TCase{"a\\nb\\nc", "a\n...", true},
        TCase{"took 12 s", "took ... s", true}, TCase{"took 12 m", "took ... s", false},
        TCase{"[x] *?\\\\ (y) \u00e9", "[x] *?\\ (y) \u00e9", true}, TCase{"axc", "a*c", false}, TCase{"axc", "a[x]c", false}}) {
    SCOPED_TRACE(std::string(c.fPrinted) + " shown as " + c.fShown);
    TProgramRun const run = Run(Block("console", std::string("$ printf '%b\\n' '") + c.fPrinted + "'\n" + c.fShown));
    EXPECT_EQ(run.fExitCode, c.fIsSame ? 0 : 1) << run.fOutput;
  }
}

TEST_F(RunPagesTest, ACommandOfAConsoleBlockWithoutOutputPrintsNothing) {
  EXPECT_EQ(Run(Block("console", "$ true\n$ echo\n")).fExitCode, 0);
  EXPECT_THAT(Run(Block("console", "$ echo more\n$ true")).fOutput,
              HasSubstr("page.md:2: other output than on the page: echo more\n"));
}

TEST_F(RunPagesTest, EachReaderRunsItsOwnBlocks) {
  std::string const page = Block("sh", "touch source") + Block("sh kit", "touch kit") + Block("console kit", "$ touch kit2");
  EXPECT_EQ(Run(page, "source").fExitCode, 0);
  EXPECT_TRUE(Exists("source") && !Exists("kit") && !Exists("kit2"));
  std::filesystem::remove(fDir.Path("place/source"));
  EXPECT_EQ(Run(page, "kit").fExitCode, 0);
  EXPECT_TRUE(!Exists("source") && Exists("kit") && Exists("kit2"));
}

TEST_F(RunPagesTest, TheReaderWithThePackagesSavesTheNamedSources) {
  std::string const page = Block("cpp", "part") + Block("cpp Clock/Clock.cpp", "int a;\n\nint b;");
  EXPECT_EQ(Run(page, "source").fExitCode, 0);
  EXPECT_FALSE(Exists("Clock"));
  EXPECT_EQ(Run(page, "kit").fExitCode, 0);
  EXPECT_EQ(ReadFile(fDir.Path("place/Clock/Clock.cpp")), "int a;\n\nint b;\n");
}

TEST_F(RunPagesTest, OnlyScriptsTestIsPassedOver) {
  std::filesystem::create_directory(fDir.Path("place/scripts"));
  WriteFile(fDir.Path("place/scripts/test"), "#!/bin/sh\ntouch tested\n");
  std::filesystem::permissions(fDir.Path("place/scripts/test"), std::filesystem::perms::owner_all);

  EXPECT_EQ(Run(Block("sh", "scripts/test     # runs all tests")).fExitCode, 0);
  EXPECT_FALSE(Exists("tested"));
  EXPECT_EQ(Results(), "passed over\tpage.md:2\t-\tscripts/test: run by .ci/run itself\n");

  for (auto const& [option, command] : {std::pair("", "scripts/test -R x"), std::pair("", "scripts/test; true"),
                                        std::pair("", "CI=true scripts/test"), std::pair("--all", "scripts/test")}) {
    SCOPED_TRACE(command);
    EXPECT_EQ(Run(Block("sh", command), "source", option).fExitCode, 0);
    EXPECT_TRUE(std::filesystem::remove(fDir.Path("place/tested")));
  }
}

TEST_F(RunPagesTest, BlocksOfAnUnknownFormAreRefused) {
  struct TCase {
    std::string fPage;
    char const* fMessage;
  };
  for (TCase const& c : {TCase{Block("", "true"), "page.md:1: a block of unknown form: \"\"\n"},
                         TCase{Block("bash", "true"), "page.md:1: a block of unknown form: \"bash\"\n"},
                         TCase{Block("sh later", "true"), "page.md:1: a block of unknown form: \"sh later\"\n"},
                         TCase{Block("console", "true"), "page.md:1: a console block begins with a command after \"$ \"\n"},
                         TCase{Block("text", "one\nscripts/run"), "page.md:1: a text block with a command: scripts/run\n"},
                         TCase{Block("text", "$ zep report"), "page.md:1: a text block with a command: $ zep report\n"},
                         TCase{Block("sh", "true \\"), "page.md:2: the last line of the block ends with a backslash\n"},
                         TCase{"```sh\ntrue\n", "page.md:1: the last block has no end\n"}}) {
    SCOPED_TRACE(c.fPage);
    TProgramRun const run = Run(c.fPage);
    EXPECT_EQ(run.fExitCode, 1);
    EXPECT_EQ(run.fOutput, c.fMessage);
  }
}

// ---- The script and the pages ----

TEST_F(RunPagesTest, WithoutRootThePagesAreSkippedWithTheReason) {
  WriteFile(fDir.Path("id"), "#!/bin/sh\necho 1000\n");
  std::filesystem::permissions(fDir.Path("id"), std::filesystem::perms::owner_all);
  for (auto const& [ci, exitCode] : {std::pair("false", 0), std::pair("true", 1)}) {
    TProgramRun const run =
        RunProgram(std::string("CI=") + ci + " PATH=" + fDir.Path() + ":$PATH " + SourcePath("scripts/pages") + " 2>&1");
    EXPECT_EQ(run.fExitCode, exitCode);
    EXPECT_EQ(run.fOutput, "scripts/pages: skipped: only root can make a bare tree\n");
  }
}

// The blocks of the pages that scripts/pages does not run. Each has a reason not to be a command.
TEST(PagesTest, TheTextBlocksHoldNoCommands) {
  std::vector<std::pair<std::string, std::string>> const expected = {
      {"docs/writing-a-provider.md", "Qualifier Secret : string, Scope(property);"},  // MOF of no example
      {"docs/writing-a-provider.md",
       "X_Clock.Kind refused: kZEPStatusTypeMismatch: 70000 is outside the range of uint16, 0 to 65535"},
      // two log lines of plug-ins that declare something wrong, which the example does not
  };
  std::vector<std::pair<std::string, std::string>> found;
  for (char const* page : {"README.md", "docs/tour.md", "docs/writing-a-provider.md"}) {
    std::istringstream lines(ReadFile(SourcePath(page)));
    std::string line, first;
    while (std::getline(lines, line))
      if (line == "```text" && std::getline(lines, first)) found.emplace_back(page, first);
  }
  EXPECT_EQ(found, expected);
}

}  // namespace
}  // namespace NQRVZEP20
