// SPDX-License-Identifier: Apache-2.0

// zep run, run as users run it.

#include "tests/tools/zep/Zep.h"

#include <gtest/gtest.h>
#include <signal.h>

#include <chrono>

namespace NQRVZEP20::zep {
namespace {

class RunTest : public testing::Test {
protected:
  TRun Run(std::vector<std::string> arguments) {
    arguments.insert(arguments.begin(), "run");
    return fZep.Run({arguments});
  }

  TInstallation fZep;
};

TEST_F(RunTest, PrintsTheOutputOfTheCommand) {
  TRun const run = Run({"sh", "-c", "echo out; echo err >&2; echo \"$0 $1\"", "zero", "a  b"});
  EXPECT_EQ(run.fStatus, 0);
  EXPECT_EQ(run.fOutput, "out\nerr\nzero a  b\n");
  EXPECT_EQ(run.fErrors, "");
}

TEST_F(RunTest, OptionsAfterTheCommandBelongToTheCommand) {
  TRun const run = Run({"echo", "--timeout", "1", "--help", "-x"});
  EXPECT_EQ(run.fStatus, 0);
  EXPECT_EQ(run.fOutput, "--timeout 1 --help -x\n");
}

TEST_F(RunTest, AZeroByteCutsOffTheRestOfItsChunk) {
  EXPECT_EQ(Run({"sh", "-c", "printf 'seen\\0lost'; sleep 1; echo +"}).fOutput, "seen+\n");
}

TEST_F(RunTest, ATimeoutOfZeroAllowsNoSilence) {
  TRun const run = Run({"--timeout", "0", "sh", "-c", "sleep 1"});
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(run.fOutput, "");
}

TEST_F(RunTest, ASeparatorMayPrecedeTheCommand) {
  EXPECT_EQ(Run({"--", "echo", "--", "a"}).fOutput, "-- a\n");
  EXPECT_EQ(Run({"--timeout", "5", "--", "sh", "-c", "echo b"}).fOutput, "b\n");
  EXPECT_EQ(Run({"echo", "--", "c"}).fOutput, "-- c\n");
  EXPECT_EQ(Run({"--"}).fStatus, 64);
  EXPECT_EQ(Run({"echo", "command:", "", "--x="}).fOutput, "command:  --x=\n");
}

TEST_F(RunTest, EverythingAfterTheSeparatorIsTheCommand) {
  for (std::string const program : {"-x", "--timeout", "--help", "--", "--x="}) {
    TRun const run = Run({"--", program, "--help"});
    EXPECT_EQ(run.fStatus, 1);
    EXPECT_EQ(run.fErrors, "zep: " + program + " was not found on PATH; is it spelled right, and installed?\n");
  }
}

TEST_F(RunTest, ReportsThatACommandFailed) {
  std::string const reason = " could not be executed, did not exit with status 0 or was killed by a signal\n";
  for (std::vector<std::string> const& command :
       {std::vector<std::string>{"sh", "-c", "echo said; exit 3"}, {"sh", "-c", "echo said; kill -9 $$"}}) {
    TRun const run = Run(command);
    EXPECT_EQ(run.fStatus, 1);
    EXPECT_EQ(run.fOutput, "said\n");
    EXPECT_EQ(run.fErrors, "zep: sh" + reason);
  }
  TRun const run = Run({"/nonexistent"});
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(run.fOutput, "");
  EXPECT_EQ(run.fErrors, "zep: /nonexistent does not exist\n");
}

// zep inherits this setting, which makes the system discard the exit status of children.
TEST_F(RunTest, ACallerThatIgnoresItsChildrenMakesNoDifference) {
  TCall call = {{"run", "echo", "done"}};
  call.fIgnoresChildren = true;
  TRun const run = fZep.Run(call);
  EXPECT_EQ(run.fStatus, 0) << run.fErrors;
  EXPECT_EQ(run.fOutput, "done\n");
}

// Blocks signals for this process and its children.
class TBlockedSignals {
public:
  TBlockedSignals() {
    sigset_t signals;
    ::sigemptyset(&signals);
    for (int const signal : {SIGINT, SIGTERM, SIGHUP, SIGCHLD}) ::sigaddset(&signals, signal);
    ::sigprocmask(SIG_BLOCK, &signals, &fBefore);
  }
  ~TBlockedSignals() { ::sigprocmask(SIG_SETMASK, &fBefore, nullptr); }
  TBlockedSignals(TBlockedSignals const&) = delete;
  TBlockedSignals& operator=(TBlockedSignals const&) = delete;

private:
  sigset_t fBefore{};
};

TEST_F(RunTest, ACallerThatBlocksSignalsDoesNotKeepZepFromEnding) {
  TBlockedSignals const blocked;
  for (int const signal : {SIGTERM, SIGINT, SIGHUP}) {
    TCall call = {{"run", "--timeout", "20", "sh", "-c", "kill -" + std::to_string(signal) + " $PPID; exec sleep 1"}};
    EXPECT_EQ(fZep.Run(call).fStatus, 128 + signal);
  }
}

TEST_F(RunTest, TheTimeoutLimitsSilence) {
  EXPECT_EQ(Run({"--timeout", "3", "sh", "-c", "sleep 1; echo a; sleep 1; echo b; sleep 1; echo c; sleep 1"}).fOutput,
            "a\nb\nc\n");
  auto const start = std::chrono::steady_clock::now();
  TRun const run = Run({"--timeout", "3", "sh", "-c", "echo $$; exec sleep 30"});
  EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(20));
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(run.fErrors,
            "zep: sh could not be executed, did not exit with status 0 or was killed by a signal, or was silent for more than 3 "
            "s and is "
            "left running\n");
  EXPECT_EQ(::kill(std::stoi(run.fOutput), SIGKILL), 0) << "the command should still run";
}

TEST_F(RunTest, AMissingCommandOrAnInvalidTimeoutIsWrongUsage) {
  TRun const run = Run({});
  EXPECT_EQ(run.fStatus, 64);
  EXPECT_EQ(run.fErrors, "zep: there is no command to run\n");
  for (char const* timeout : {"-2", "x", "99999999999"}) EXPECT_EQ(Run({"--timeout", timeout, "true"}).fStatus, 64) << timeout;
  EXPECT_EQ(Run({"--", ""}).fErrors, "zep: there is no command to run\n");
  TRun const unknown = Run({"--unknown", "true"});
  EXPECT_EQ(unknown.fStatus, 64);
  EXPECT_EQ(unknown.fErrors, "zep: unknown option --unknown\n");
}

}  // namespace
}  // namespace NQRVZEP20::zep
