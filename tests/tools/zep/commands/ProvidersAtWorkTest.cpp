// SPDX-License-Identifier: Apache-2.0

// The limits of plug-ins, and what zep does while they work.

#include "tests/tools/zep/commands/MisbehavingPlugIns.h"

#include <gmock/gmock.h>
#include <pty.h>
#include <sched.h>
#include <sys/resource.h>
#include <sys/wait.h>

#include <algorithm>
#include <chrono>
#include <csignal>

namespace NQRVZEP20::zep {
namespace {

using testing::AllOf;
using testing::HasSubstr;

class ProvidersAtWorkTest : public TMisbehavingPlugInsTest {
protected:
  // Starts zep with these arguments of a shell.
  pid_t Start(std::string const& arguments, TTempDir const& temporary) const {
    pid_t const zep = ::fork();
    if (zep != 0) return zep;
    ::setenv("ZEP_MISDEEDS", fZep.Path("").c_str(), 1);
    ::setenv("TMPDIR", temporary.Path().c_str(), 1);
    std::string const line = "exec '" + fZep.Path("bin/zep") + "' " + arguments;
    ::execl("/bin/sh", "sh", "-c", line.c_str(), nullptr);
    ::_exit(127);
  }

  // Interrupts the running zep while it fills the plug-in Hangs: it ends by the signal, and the plug-in with it.
  void InterruptWhileItHangs(pid_t zep) const {
    WaitFor("Hangs");
    ::kill(zep, SIGINT);
    int status = 0;
    ::waitpid(zep, &status, 0);
    EXPECT_TRUE(WIFSIGNALED(status) && WTERMSIG(status) == SIGINT);
    ExpectNoProcess("Hangs");
  }
};

TEST_F(ProvidersAtWorkTest, PlugInsThatHangOrStopAreEndedAtTheTimeLimit) {
  fZep.Remove("libHost.nsp.so");
  Add({"Hangs", "HangsBlocked", "Stops", "LoadHangs", "RegistrationHangs", "IsTraced", "SaysLoaded"});
  auto const document = JsonOf(Run({"report", "--json", "--plugin-timeout", "6"}));
  for (char const* name : {"Hangs", "HangsBlocked", "Stops", "LoadHangs", "RegistrationHangs", "IsTraced", "SaysLoaded"}) {
    EXPECT_EQ(FailureIn(document, name)["error"], "it exceeded the time limit of 6 s") << name;
    EXPECT_EQ(FailureIn(document, name)["limit"], "time") << name;
  }
  EXPECT_EQ(FailureIn(document, "LoadHangs")["stage"], "static construction");
  EXPECT_EQ(FailureIn(document, "RegistrationHangs")["stage"], "registration");
  ExpectNoProcess("Hangs");
  ExpectNoProcess("HangsBlocked");
}

// The processors that this process, and hence zep, may use; the old ones again at the end.
class TProcessors {
public:
  explicit TProcessors(std::size_t most) {
    ::sched_getaffinity(0, sizeof fBefore, &fBefore);
    cpu_set_t some;
    CPU_ZERO(&some);
    for (std::size_t cpu = 0; cpu < CPU_SETSIZE && fCount < most; ++cpu)
      if (CPU_ISSET(cpu, &fBefore)) CPU_SET(cpu, &some), ++fCount;
    ::sched_setaffinity(0, sizeof some, &some);
  }
  ~TProcessors() { ::sched_setaffinity(0, sizeof fBefore, &fBefore); }
  std::size_t Count() const { return fCount; }

private:
  cpu_set_t fBefore;
  std::size_t fCount = 0;
};

// zep ends soon after the limit: it does not wait for a supervisor that is stopped.
TEST_F(ProvidersAtWorkTest, APlugInThatStopsItsSupervisorIsNamedSoonAfterItsLimit) {
  NEEDS(::geteuid() == 0, "root, who may trace every process");
  fZep.Remove("libHost.nsp.so");
  Add({"StopsItsSupervisor", "TracesItsSupervisor", "TerminatesAndHangs", "StopsItsSupervisorAndReturns"});
  TProcessors const processors(2);
  int const turns = processors.Count() == 2 ? 2 : 3;  // of three plug-ins that take the time to the limit
  auto const begin = std::chrono::steady_clock::now();
  auto const document = JsonOf(Run({"report", "--json", "--plugin-timeout", "6"}));
  EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::seconds(6 * turns + 8));
  std::string const limit = "it exceeded the time limit of 6 s";
  EXPECT_EQ(FailureIn(document, "StopsItsSupervisor")["error"], limit + ", and has stopped its supervisor process");
  EXPECT_EQ(FailureIn(document, "TracesItsSupervisor")["error"], limit + ", and has stopped its supervisor process");
  EXPECT_EQ(FailureIn(document, "TerminatesAndHangs")["error"], limit);
  EXPECT_EQ(FailureIn(document, "StopsItsSupervisorAndReturns")["error"], "it has stopped its supervisor process");
  ExpectNoProcess("StopsItsSupervisor");
  ExpectNoProcess("TracesItsSupervisor");
}

TEST_F(ProvidersAtWorkTest, AsManyPlugInsWorkSideBySideAsThereAreProcessors) {
  std::vector<std::string> const names = {"OverlapsA", "OverlapsB", "OverlapsC", "OverlapsD"};
  Add(names);
  fZep.Remove("libHost.nsp.so");
  fs::create_directory(fZep.Path("running"));
  for (std::size_t const most : {1, 2}) {
    TProcessors const processors(most);
    TEnvironmentGuard const expected("ZEP_OVERLAPS", std::to_string(processors.Count()).c_str());
    EXPECT_EQ(Run({"classes"}).fStatus, 0);
    std::size_t overlaps = 0;
    for (std::string const& name : names)
      overlaps = std::max<std::size_t>(overlaps, std::stoul(ReadFile(fZep.Path("most-" + name))));
    EXPECT_EQ(overlaps, processors.Count());
  }
}

// Three seconds for each.
TEST_F(ProvidersAtWorkTest, TheTimeLimitIsThatOfTheLoadAndAgainOfTheFill) {
  fZep.Remove("libHost.nsp.so");
  Add({"DawdlesTwice"});
  TRun const run = Run({"classes", "--plugin-timeout", "5"});
  EXPECT_EQ(run.fStatus, 0) << run.fErrors;
  EXPECT_THAT(run.fOutput, HasSubstr("X_DawdlesTwice"));
}

TEST_F(ProvidersAtWorkTest, AClosedDescriptorIsNamedEvenIfTheTimeLimitIsShort) {
  fZep.Remove("libHost.nsp.so");
  Add({"Closes"});
  auto const failure = FailureIn(JsonOf(Run({"report", "--json", "--plugin-timeout", "5"})), "Closes");
  EXPECT_EQ(failure["error"], "it closed the descriptor for its result");
  EXPECT_EQ(failure["stage"], "fill");
}

TEST_F(ProvidersAtWorkTest, APlugInThatFillsMemoryIsEndedAtTheMemoryLimit) {
  if (kIsSanitized) GTEST_SKIP() << "a sanitizer reserves more address space than any limit";
  Add({"FillsMemory"});
  TRun const run = Run({"report", "--json", "--plugin-memory", "64"});
  EXPECT_EQ(run.fStatus, 2);
  EXPECT_EQ(FailureIn(JsonOf(run), "FillsMemory")["error"], "std::bad_alloc (the memory limit is 64 MiB)");
  EXPECT_EQ(FailureIn(JsonOf(run), "FillsMemory")["limit"], "memory");
  EXPECT_EQ(FailureIn(JsonOf(run), "FillsMemory")["exception"], "std::bad_alloc");
}

TEST_F(ProvidersAtWorkTest, AnEndlessAnswerIsCutOff) {
  Add({"AnswersForever"});
  TRun const run = Run({"report", "--json"});
  EXPECT_EQ(run.fStatus, 2);
  EXPECT_EQ(FailureIn(JsonOf(run), "AnswersForever")["error"], "its result exceeds 268435456 bytes");
  EXPECT_EQ(FailureIn(JsonOf(run), "AnswersForever")["limit"], "size");
}

// The address space of zep, and of each plug-in, is limited to far less than what is printed in that time.
TEST_F(ProvidersAtWorkTest, APlugInThatPrintsForEverIsEndedAndItsWordsAreCut) {
  fZep.Remove("libHost.nsp.so");
  Add({"PrintsForever", "PrintsErrorsForever"});
  rlimit before{};
  ::getrlimit(RLIMIT_AS, &before);
  rlimit const most{256 * 1024 * 1024, before.rlim_max};
  if (!kIsSanitized) ::setrlimit(RLIMIT_AS, &most);  // a sanitizer reserves more
  TRun const run = Run({"report", "--json", "--plugin-timeout", "6"});
  ::setrlimit(RLIMIT_AS, &before);
  EXPECT_EQ(run.fStatus, 1);
  auto const document = JsonOf(run);
  for (auto const& plugIn : document["plugIns"]) {
    std::string const words = plugIn["words"];
    EXPECT_EQ(plugIn["providers"][0]["error"], "it exceeded the time limit of 6 s");
    EXPECT_EQ(words.rfind("begin....", 0), 0u);
    EXPECT_LT(words.size(), 9000u);
    EXPECT_THAT(words, testing::ContainsRegex("[0-9]{8,} bytes omitted"));
  }
  EXPECT_EQ(document["plugIns"].size(), 2u);
}

// ---- Interrupts and the terminal ----

TEST_F(ProvidersAtWorkTest, AnInterruptLeavesNoProcess) {
  Add({"Hangs"});
  pid_t const zep = StartReport();
  InterruptWhileItHangs(zep);
}

TEST_F(ProvidersAtWorkTest, AnInterruptedRecordingOrBundleLeavesNoFiles) {
  Add({"Hangs"});
  TTempDir const temporary, work;
  for (char const* command : {"record", "report --bundle"}) {
    fs::remove(fZep.Path("Hangs"));
    InterruptWhileItHangs(Start(command + (" '" + work.Path("new") + "'"), temporary));
    EXPECT_TRUE(fs::is_empty(temporary.Path())) << command;
    EXPECT_TRUE(fs::is_empty(work.Path())) << command;
  }
}

// The plug-in that hangs takes the place of one that was recorded.
TEST_F(ProvidersAtWorkTest, AnInterruptedReplayLeavesNoFiles) {
  fZep.Remove("libHost.nsp.so");
  fZep.Add("libHangs.nsp.so", TEST_LIB_DIR "/libHost.nsp.so");
  ASSERT_EQ(Run({"record", fZep.Path("here.rec")}).fStatus, 0);
  Add({"Hangs"});
  TTempDir const temporary;
  InterruptWhileItHangs(Start("report --replay '" + fZep.Path("here.rec") + "'", temporary));
  EXPECT_TRUE(fs::is_empty(temporary.Path()));
}

TEST_F(ProvidersAtWorkTest, APlugInThatKillsZepLeavesNoProcess) {
  Add({"KillsItsOwner"});
  int status = 0;
  ::waitpid(StartReport(), &status, 0);
  EXPECT_TRUE(WIFSIGNALED(status) && WTERMSIG(status) == SIGKILL);
  ExpectNoProcess("KillsItsOwner");
}

// As after Ctrl-Z: zep continues where it was stopped.
TEST_F(ProvidersAtWorkTest, ZepThatAPlugInStopsContinues) {
  Add({"StopsItsOwner"});
  pid_t const zep = StartReport();
  int status = 0;
  ::waitpid(zep, &status, WUNTRACED);
  ASSERT_TRUE(WIFSTOPPED(status));
  ::kill(zep, SIGCONT);
  ::waitpid(zep, &status, 0);
  EXPECT_TRUE(WIFEXITED(status) && WEXITSTATUS(status) == 0);
}

// What the shell command of zep writes to a terminal.
std::string OnTerminal(std::string const& command, std::map<std::string, std::string> const& environment) {
  int terminal = -1;
  pid_t const zep = ::forkpty(&terminal, nullptr, nullptr, nullptr);
  if (zep == 0) {
    for (auto const& [name, value] : environment) ::setenv(name.c_str(), value.c_str(), 1);
    ::execl("/bin/sh", "sh", "-c", command.c_str(), nullptr);
    ::_exit(127);
  }
  std::string text;
  char piece[1024];
  for (ssize_t count; (count = ::read(terminal, piece, sizeof piece)) > 0;) text.append(piece, static_cast<std::size_t>(count));
  ::close(terminal);
  ::waitpid(zep, nullptr, 0);
  return text;
}

TEST_F(ProvidersAtWorkTest, ProgressIsShownOnATerminalOnly) {
  Add({"LoadHangs"});
  auto environment = Environment();
  std::string const command = fZep.Path("bin/zep") + " classes --plugin-timeout 6";
  environment["TERM"] = "xterm";
  EXPECT_THAT(OnTerminal(command, environment), HasSubstr("\r\x1b[KLoadHangs: static construction, "));
  EXPECT_THAT(OnTerminal("set -m; " + command + " & wait", environment),
              AllOf(HasSubstr("LoadHangs: it exceeded"), testing::Not(HasSubstr("LoadHangs: static construction"))));
  environment["TERM"] = "dumb";
  std::string const dumb = OnTerminal(command, environment);
  EXPECT_THAT(dumb, HasSubstr("LoadHangs: static construction, "));
  EXPECT_EQ(dumb.find('\x1b'), dumb.npos);
  EXPECT_THAT(Run({"classes", "--plugin-timeout", "6"}).fErrors, testing::Not(HasSubstr("LoadHangs: static construction")));
}

}  // namespace
}  // namespace NQRVZEP20::zep
