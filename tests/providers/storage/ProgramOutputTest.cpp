// SPDX-License-Identifier: Apache-2.0
#include "providers/storage/ProgramOutput.h"

#include "tests/providers/storage/MachineTree.h"

namespace NQRVZEP20 {
namespace {

using TClock = std::chrono::steady_clock;

std::string OutputOfScript(std::string const& script, std::chrono::milliseconds limit = std::chrono::seconds(20)) {
  return TextOf(OutputOf("/bin/sh", {"-c", script}, TClock::now() + limit));
}

TEST(ProgramOutputTest, OutputIsReturnedWhateverTheExitStatusIs) {
  EXPECT_EQ(OutputOfScript("echo text; echo error >&2; exit 4"), "text\n");
  EXPECT_EQ(OutputOfScript("exit 0"), "");
}

TEST(ProgramOutputTest, TheInputIsEmpty) { EXPECT_EQ(OutputOfScript("cat"), ""); }

TEST(ProgramOutputTest, AProgramThatDoesNotEndIsKilled) {
  auto const start = TClock::now();
  EXPECT_EQ(OutputOfScript("echo begin; exec sleep 30", std::chrono::milliseconds(100)),
            "</bin/sh did not end within its time limit>");
  EXPECT_LT(TClock::now() - start, std::chrono::seconds(15));
}

TEST(ProgramOutputTest, EndlessOutputEnds) { EXPECT_EQ(OutputOfScript("exec yes"), "</bin/sh wrote too much>"); }

TEST(ProgramOutputTest, AProgramThatCannotBeStartedHasAReason) {
  EXPECT_EQ(TextOf(OutputOf("/no/such", {}, TClock::now() + std::chrono::seconds(1))),
            "</no/such cannot be started: No such file or directory>");
}

TEST(ProgramOutputTest, ProgramsAreFoundByPath) {
  TTempDir const dir;
  WriteFile(dir.Path("tool"), "");
  std::filesystem::permissions(dir.Path("tool"), std::filesystem::perms::owner_all);
  TEnvironmentGuard const path("PATH", (":relative:" + dir.Path()).c_str());
  EXPECT_EQ(FindProgram("tool"), dir.Path("tool"));
  EXPECT_EQ(FindProgram("no such tool"), "");
}

}  // namespace
}  // namespace NQRVZEP20
