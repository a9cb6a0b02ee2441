// SPDX-License-Identifier: Apache-2.0

// The scripts' messages when they cannot continue.

#include "tests/Support.h"
#include "tests/os/Programs.h"

#include <gmock/gmock.h>

namespace NQRVZEP20 {
namespace {

namespace fs = std::filesystem;

class ScriptsTest : public testing::Test {
protected:
  // Adds a program, a script of one line, to the PATH of Run.
  void Program(std::string const& name, std::string const& line) {
    WriteFile(fDir.Path(name), "#!/bin/bash\n" + line + "\n");
    fs::permissions(fDir.Path(name), fs::perms::owner_all);
  }

  // Runs a function of scripts/lib.sh. Only sed, dirname, grep and the test's programs are on PATH.
  TProgramRun Run(std::string const& function) {
    for (char const* program : {"sed", "dirname", "grep"})
      fs::create_symlink(std::string("/usr/bin/") + program, fDir.Path(program));
    return RunProgram("PATH=" + fDir.Path() + " /bin/bash -c 'set -euo pipefail; source " + SourcePath("scripts/lib.sh") + "; " +
                      function + "' 2>&1");
  }

  TTempDir fDir;
};

TEST_F(ScriptsTest, WithoutSudoTheMissingPackagesAreNamed) {
  Program("id", "echo 1000");
  Program("dpkg-query", "exit 1");
  TProgramRun const run = Run("need_packages build");
  EXPECT_EQ(run.fExitCode, 1);
  EXPECT_THAT(run.fOutput, testing::StartsWith("Packages are missing, and sudo is not installed. Run as root: "
                                               "apt-get install cmake "));
  EXPECT_EQ(run.fOutput.find("command not found"), std::string::npos) << run.fOutput;
}

TEST_F(ScriptsTest, WithSudoThePackagesAreInstalled) {
  Program("id", "echo 1000");
  Program("dpkg-query", "exit 1");
  Program("sudo", "echo sudo \"$1\" >&2");
  EXPECT_THAT(Run("need_packages build").fOutput, testing::HasSubstr("sudo apt-get\nsudo env\n"));
}

}  // namespace
}  // namespace NQRVZEP20
