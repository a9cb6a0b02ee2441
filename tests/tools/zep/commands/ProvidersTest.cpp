// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/commands/Providers.h"

#include "tests/Support.h"
#include "tests/tools/zep/Zep.h"

#include <gmock/gmock.h>
#include <pty.h>
#include <sched.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <csignal>
#include <regex>

namespace NQRVZEP20::zep {
namespace {

using testing::AllOf;
using testing::Contains;
using testing::HasSubstr;

// The times that plug-ins take, and those that clocks show, differ.
std::string WithoutTimes(std::string const& text) {
  std::string const json = std::regex_replace(text, std::regex("\"milliseconds\": [0-9.e+-]+"), "\"milliseconds\": N");
  std::string const clocks = std::regex_replace(json, std::regex("(\"Seconds\": \\{[^}]*\"value\": )\"[0-9]+\""), "$1N");
  return std::regex_replace(clocks, std::regex(" *[0-9]+\\.[0-9] ms *"), " N ms");
}

class ProvidersTest : public testing::Test {
protected:
  void Add(std::vector<std::string> const& misdeeds) {
    for (std::string const& name : misdeeds) fZep.Add("lib" + name + ".nsp.so", MISBEHAVES);
  }

  TRun Run(std::vector<std::string> const& arguments) const {
    TCall call;
    call.fArguments = arguments;
    call.fEnvironment = Environment();
    return fZep.Run(call);
  }

  std::map<std::string, std::string> Environment() const {
    return {{"ZEP_SMBIOS_TABLE", SamplePath()},
            {"ZEP_HOST_NAME", "db1"},
            {"ZEP_MISDEEDS", fZep.Path("")},
            {"ZEP_TEST_PROVIDER", "odd hard-to-name two-systems"}};
  }

  // The plug-in, or its first provider when that failed.
  static nlohmann::json FailureIn(nlohmann::json const& document, std::string const& name) {
    for (auto const& plugIn : document["plugIns"])
      if (plugIn["name"] == name)
        return plugIn["error"].is_null() && !plugIn["providers"].empty() ? plugIn["providers"][0] : plugIn;
    return {};
  }

  void WaitFor(std::string const& file) const {
    for (int tries = 0; ReadFile(fZep.Path(file)).empty() && tries < 6000; ++tries) ::usleep(10000);
    ASSERT_FALSE(ReadFile(fZep.Path(file)).empty());
  }

  void ExpectNoProcess(std::string const& file) const {
    std::string const id = ReadFile(fZep.Path(file));
    ASSERT_FALSE(id.empty()) << file;
    for (int tries = 0; fs::exists("/proc/" + id) && tries < 6000; ++tries) ::usleep(10000);
    EXPECT_FALSE(fs::exists("/proc/" + id)) << file;
  }

  // The output is lost.
  pid_t StartReport() const {
    pid_t const zep = ::fork();
    if (zep != 0) return zep;
    for (auto const& [name, value] : Environment()) ::setenv(name.c_str(), value.c_str(), 1);
    [[maybe_unused]] bool const isLost = std::freopen("/dev/null", "w", stdout) != nullptr;
    ::execl(fZep.Path("bin/zep").c_str(), "zep", "report", nullptr);
    ::_exit(127);
  }

  TInstallation fZep;
};

// ---- Plug-ins that behave ----

TEST_F(ProvidersTest, TheOutputIsThatOfPlugInsInTheProcessOfZep) {
  TTempDir const nothing;  // instead of this machine, whose load changes
  TEnvironmentGuard const root("ZEP_ROOT", nothing.Path().c_str());
  fZep.Add("libTest.nsp.so", TEST_PROVIDER);
  fZep.Add("libClock.nsp.so", CLOCK_PLUGIN);
  fZep.Add("libDisks.nsp.so", DISKS_PLUGIN);
  for (std::vector<std::string> arguments : std::vector<std::vector<std::string>>{{"report"},
                                                                                  {"report", "--json"},
                                                                                  {"report", "--sample", "--json"},
                                                                                  {"classes"},
                                                                                  {"classes", "--json"},
                                                                                  {"show", "X_Odd"},
                                                                                  {"show", "X_Odd", "--json"},
                                                                                  {"show", "CIM_Processor"},
                                                                                  {"show", "X_Plain#1"}}) {
    SCOPED_TRACE(arguments.back());
    TRun const apart = Run(arguments);
    arguments.push_back("--in-process");
    TRun const inProcess = Run(arguments);
    EXPECT_EQ(WithoutTimes(apart.fOutput), WithoutTimes(inProcess.fOutput));
    EXPECT_FALSE(apart.fOutput.empty());
    EXPECT_EQ(apart.fStatus, inProcess.fStatus);
  }
}

// ---- Plug-ins that misbehave ----

TEST_F(ProvidersTest, EachMisdeedCostsItsOwnRow) {
  struct TRow {
    char const *fName, *fStage, *fError, *fLastLogLine;
  } const rows[] = {
      {"Throws", "fill", "kZEPStatusAccessDenied (no disk)", "[Error] the disk is gone"},
      {"ThrowsInAThread", "fill", "in a thread", nullptr},
      {"ThrowsWhileItMayNot", "fill", "it may not", nullptr},
      {"Crashes", "fill", "it was killed by SIGSEGV (Segmentation fault)", "[Error] about to crash"},
      {"CrashesAfterWords", "fill", "it was killed by SIGSEGV (Segmentation fault)", nullptr},
      {"SaysDone", "fill", "its result ended before its namespace was complete", nullptr},
      {"Aborts", "fill", "it was killed by SIGABRT (Aborted)", nullptr},
      {"Exits", "fill", "it exited with status 0", nullptr},
      {"ExitsQuickly", "fill", "it exited with status 4", nullptr},
      {"Terminates", "fill", "it called std::terminate", nullptr},
      {"HasNoNamespace", "fill", "it has no namespace", nullptr},
      {"ExitsAtOnce", "fill", "it exited with status 7", nullptr},
      {"Kills", "fill", "it was killed by SIGTERM (Terminated)", nullptr},
      {"KillsItsSupervisor", "fill", "its supervisor process died", nullptr},
      {"TerminatesAndExits", "fill", "it exited with status 5", nullptr},
      {"TerminatesAndReturns", "fill", "it was killed by SIGABRT (Aborted)", nullptr},
      {"DestructorThrows", "fill", "at the end", nullptr},
      {"ExitsWithThrowingStatic", "fill", "at the end", nullptr},
      {"InstanceThrowsAtItsEnd", "fill", "an instance at its end", nullptr},
      {"Executes", "fill", "it exited with status 9", nullptr},
      {"Closes", "fill", "it closed the descriptor for its result", nullptr},
      {"LoadThrows", "static construction", "no disk today", nullptr},
      {"LoadThrowsANumber", "static construction", "it threw an object that is not a std::exception", nullptr},
      {"LoadAborts", "static construction", "it was killed by SIGABRT (Aborted)", nullptr},
      {"LoadCloses", "static construction", "it closed the descriptor for its result", nullptr},
      {"LoadCrashes", "static construction", "it was killed by SIGSEGV (Segmentation fault)", nullptr},
      {"LoadExits", "static construction", "it exited with status 3", nullptr},
      {"RegistrationThrows", "registration", "it has no name", nullptr},
      {"RegistersNull", "registration", "kZEPStatusFail (it registers an empty pointer)", nullptr},
  };
  for (TRow const& row : rows) Add({row.fName});
  std::vector<std::string> const harmless = {
      "ChangesDirectory",     "LimitsItself",          "Prints", "Forks", "ForksTwice", "Reads", "AnswersBroken",
      "LeavesThrowingStatic", "ProviderThrowsAtItsEnd"};
  Add(harmless);
  TRun const run = Run({"report", "--json"});
  EXPECT_EQ(run.fStatus, 2);
  auto const document = JsonOf(run);
  EXPECT_EQ(document["identity"]["serialNumber"]["value"], "KQ12345");
  EXPECT_EQ(document["identity"]["hostName"]["value"], "db1");
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fName);
    auto const failure = FailureIn(document, row.fName);
    EXPECT_EQ(failure["error"], row.fError);
    EXPECT_EQ(failure["stage"], row.fStage);
    EXPECT_EQ(failure["lastLogLine"], row.fLastLogLine != nullptr ? nlohmann::json(row.fLastLogLine) : nlohmann::json());
    EXPECT_THAT(document["reason"].get<std::string>(), HasSubstr("lib" + std::string(row.fName) + ".nsp.so"));
  }
  for (std::string const& name : harmless) EXPECT_TRUE(FailureIn(document, name)["error"].is_null()) << name;
  EXPECT_EQ(FailureIn(document, "AnswersBroken")["namespace"], "root/own");
  EXPECT_THAT(document["instanceFailures"],
              Contains(nlohmann::json{{"provider", "AnswersBroken"}, {"error", "kZEPStatusTypeMismatch"}}));
  ExpectNoProcess("Forks");
  ExpectNoProcess("KillsItsSupervisor");
}

// The healthy plug-in is at work when the other one fails.
TEST_F(ProvidersTest, AFailureThatIsHardToReportLeavesOtherPlugInsAlone) {
  struct TRow {
    char const *fName, *fStage, *fError;
    bool fNeedsMemoryLimit;
  } const rows[] = {
      {"ThrowsNullText", "fill", "it threw an exception without a text", false},
      {"NameThrowsAtOnce", "registration", "it has no second name", false},
      {"LeaksAndThrows", "fill", "std::bad_alloc (the memory limit is 64 MiB)", true},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fName);
    if (row.fNeedsMemoryLimit && kIsSanitized) continue;  // a sanitizer reserves more address space than any limit
    Add({"Dawdles", row.fName});
    std::vector<std::string> arguments = {"report", "--json"};
    if (row.fNeedsMemoryLimit) arguments.insert(arguments.end(), {"--plugin-memory", "64"});
    TRun const run = Run(arguments);
    EXPECT_EQ(run.fStatus, 2);
    auto const failure = FailureIn(JsonOf(run), row.fName);
    EXPECT_EQ(failure["error"], row.fError);
    EXPECT_EQ(failure["stage"], row.fStage);
    EXPECT_TRUE(FailureIn(JsonOf(run), "Dawdles")["error"].is_null());
    fZep.Remove("lib" + std::string(row.fName) + ".nsp.so");
  }
}

TEST_F(ProvidersTest, APlugInThatTheLinkerRefusesFailsWhenItIsOpened) {
  fZep.Add("libLacks.nsp.so", LACKS_SYMBOL);
  TRun const run = Run({"report", "--json"});
  EXPECT_EQ(run.fStatus, 2);
  auto const failure = FailureIn(JsonOf(run), "Lacks");
  EXPECT_EQ(failure["stage"], "open");
  EXPECT_THAT(failure["error"].get<std::string>(), HasSubstr("undefined symbol: "));
  EXPECT_EQ(fs::path(failure["file"].get<std::string>()).filename(), "libLacks.nsp.so");
  EXPECT_EQ(JsonOf(run)["identity"]["serialNumber"]["value"], "KQ12345");
}

TEST_F(ProvidersTest, ThePrintedLinesOfAPlugInAreShownAsItsOwn) {
  Add({"Prints", "PrintsMuch", "CrashesAfterWords", "Reads"});
  TRun const run = Run({"report", "--json"});
  EXPECT_EQ(run.fStatus, 2);
  auto const words = [document = JsonOf(run)](std::string const& name) {
    for (auto const& plugIn : document["plugIns"])
      if (plugIn["name"] == name) return plugIn["words"].get<std::string>();
    return std::string();
  };
  EXPECT_EQ(words("Prints"), "words of 17 bytes\nand more\n");
  EXPECT_EQ(words("CrashesAfterWords"), "last words\n");
  EXPECT_EQ(words("Reads"), "read -1\n");
  EXPECT_EQ(words("PrintsMuch").rfind("line 0\nline 1\n", 0), 0u);
  EXPECT_THAT(words("PrintsMuch"), AllOf(HasSubstr(" bytes omitted]\n"), HasSubstr("line 99999\n")));
  EXPECT_LT(words("PrintsMuch").size(), 9000u);
  EXPECT_THAT(run.fErrors, AllOf(HasSubstr("zep: plug-in CrashesAfterWords printed: last words\n"),
                                 HasSubstr("zep: plug-in PrintsMuch printed: line 99999\n")));
}

TEST_F(ProvidersTest, ALongErrorAndALongLogLineAreCut) {
  Add({"LogsMuch"});
  TRun const run = Run({"report", "--json"});
  EXPECT_EQ(run.fStatus, 2);
  auto const failure = FailureIn(JsonOf(run), "LogsMuch");
  EXPECT_EQ(failure["error"], std::string(1021, 'y') + "...");
  EXPECT_EQ(failure["lastLogLine"].get<std::string>().size(), 1024u);
}

TEST_F(ProvidersTest, AProviderThatIsRegisteredWhileAnotherOneFillsIsNamed) {
  Add({"RegistersLate"});
  TRun const run = Run({"report", "--json"});
  EXPECT_EQ(run.fStatus, 2);
  EXPECT_THAT(JsonOf(run)["reason"].get<std::string>(),
              HasSubstr("not filled, because it was registered after the plug-in had been loaded"));
}

TEST_F(ProvidersTest, ANameThatIsNotUtf8IsShownWithReplacements) {
  Add({"HasAnOddName"});
  TRun const run = Run({"report", "--json"});
  EXPECT_EQ(run.fStatus, 0);
  auto const document = JsonOf(run);
  std::vector<std::string> names;
  for (auto const& plugIn : document["plugIns"])
    for (auto const& provider : plugIn["providers"]) names.push_back(provider["name"]);
  EXPECT_THAT(names, Contains("odd \xef\xbf\xbd"));
}

TEST_F(ProvidersTest, TheNameOfAProviderIsReadWhenItIsRegistered) {
  Add({"Dawdles", "NameThrowsLater"});
  for (char const* name : {"Dawdles", "NameThrowsLater"}) {
    TRun const run = Run({"show", "X_" + std::string(name)});
    EXPECT_EQ(run.fStatus, 0) << run.fErrors;
    EXPECT_THAT(run.fOutput, HasSubstr("X_" + std::string(name)));
  }
}

TEST_F(ProvidersTest, ANameThatAPlugInRegistersTwiceIsNamed) {
  Add({"RegistersTwice"});
  TRun const run = Run({"report", "--json"});
  EXPECT_EQ(run.fStatus, 2);
  EXPECT_THAT(JsonOf(run)["reason"].get<std::string>(),
              HasSubstr("RegistersTwice: the plug-in registers this name twice; the second registration is ignored "
                        "(registration, libRegistersTwice.nsp.so)"));
  EXPECT_EQ(Run({"show", "X_RegistersTwice"}).fOutput.rfind("root/RegistersTwice:X_RegistersTwice\n", 0), 0u);
}

TEST_F(ProvidersTest, OfTwoPlugInsWithOneNameBothAreNamed) {
  Add({"TwinA", "TwinB"});
  TRun const run = Run({"report", "--json"});
  EXPECT_EQ(run.fStatus, 2);
  EXPECT_TRUE(FailureIn(JsonOf(run), "TwinA")["error"].is_null());
  auto const second = FailureIn(JsonOf(run), "TwinB");
  EXPECT_EQ(second["error"], "the name Twin is already registered by libTwinA.nsp.so");
  EXPECT_EQ(second["stage"], "registration");
  EXPECT_THAT(JsonOf(run)["reason"].get<std::string>(), HasSubstr("libTwinB.nsp.so"));
}

TEST_F(ProvidersTest, OfTwoPlugInsWithOneNameTheSecondCountsWhenTheFirstFails) {
  Add({"TwinThrows", "TwinZ"});
  TRun const run = Run({"report", "--json"});
  EXPECT_EQ(run.fStatus, 2);
  EXPECT_EQ(FailureIn(JsonOf(run), "TwinThrows")["error"],
            "no twin today; the name Twin is then registered by libTwinZ.nsp.so, which is used instead");
  EXPECT_TRUE(FailureIn(JsonOf(run), "TwinZ")["error"].is_null());
}

TEST_F(ProvidersTest, NoCoreDumpOfAPlugInIsLeft) {
  Add({"Crashes", "LoadCrashes"});
  rlimit before{};
  ::getrlimit(RLIMIT_CORE, &before);
  rlimit const most{before.rlim_max, before.rlim_max};
  ::setrlimit(RLIMIT_CORE, &most);
  TCall call;
  call.fArguments = {"report"};
  call.fEnvironment = Environment();
  call.fDirectory = fZep.Path("bin");
  EXPECT_EQ(fZep.Run(call).fStatus, 2);
  ::setrlimit(RLIMIT_CORE, &before);
  for (auto const& file : fs::directory_iterator(fZep.Path("bin")))
    EXPECT_NE(file.path().filename().string().rfind("core", 0), 0u) << file.path();
}

TEST_F(ProvidersTest, TheRowOfAFailureNamesFileProviderStageCauseAndLogLine) {
  Add({"Crashes"});
  TRun const run = Run({"report"});
  EXPECT_EQ(run.fStatus, 2);
  std::string const words = std::regex_replace(run.fOutput, std::regex("\\s+"), " ");
  EXPECT_THAT(words, HasSubstr("provider Crashes failed: it was killed by SIGSEGV (Segmentation fault) (fill, "
                               "libCrashes.nsp.so); last log line: [Error] about to crash"));
  EXPECT_EQ(Run({"classes"}).fStatus, 2);
  EXPECT_EQ(Run({"classes"}).fErrors,
            "zep: Crashes: it was killed by SIGSEGV (Segmentation fault) (fill, libCrashes.nsp.so); last "
            "log line: [Error] about to crash\n");
  EXPECT_EQ(Run({"show", "CIM_Chassis"}).fStatus, 2);
}

TEST_F(ProvidersTest, PlugInsThatHangOrStopAreEndedAtTheTimeLimit) {
  fZep.Remove("libHost.nsp.so");
  Add({"Hangs", "HangsBlocked", "Stops", "LoadHangs", "RegistrationHangs", "IsTraced", "SaysLoaded"});
  auto const document = JsonOf(Run({"report", "--json", "--plugin-timeout", "6"}));
  for (char const* name : {"Hangs", "HangsBlocked", "Stops", "LoadHangs", "RegistrationHangs", "IsTraced", "SaysLoaded"})
    EXPECT_EQ(FailureIn(document, name)["error"], "it exceeded the time limit of 6 s") << name;
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
TEST_F(ProvidersTest, APlugInThatStopsItsSupervisorIsNamedSoonAfterItsLimit) {
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

TEST_F(ProvidersTest, AsManyPlugInsWorkSideBySideAsThereAreProcessors) {
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
TEST_F(ProvidersTest, TheTimeLimitIsThatOfTheLoadAndAgainOfTheFill) {
  fZep.Remove("libHost.nsp.so");
  Add({"DawdlesTwice"});
  TRun const run = Run({"classes", "--plugin-timeout", "5"});
  EXPECT_EQ(run.fStatus, 0) << run.fErrors;
  EXPECT_THAT(run.fOutput, HasSubstr("X_DawdlesTwice"));
}

TEST_F(ProvidersTest, AClosedDescriptorIsNamedEvenIfTheTimeLimitIsShort) {
  fZep.Remove("libHost.nsp.so");
  Add({"Closes"});
  auto const failure = FailureIn(JsonOf(Run({"report", "--json", "--plugin-timeout", "5"})), "Closes");
  EXPECT_EQ(failure["error"], "it closed the descriptor for its result");
  EXPECT_EQ(failure["stage"], "fill");
}

TEST_F(ProvidersTest, APlugInThatFillsMemoryIsEndedAtTheMemoryLimit) {
  if (kIsSanitized) GTEST_SKIP() << "a sanitizer reserves more address space than any limit";
  Add({"FillsMemory"});
  TRun const run = Run({"report", "--json", "--plugin-memory", "64"});
  EXPECT_EQ(run.fStatus, 2);
  EXPECT_EQ(FailureIn(JsonOf(run), "FillsMemory")["error"], "std::bad_alloc (the memory limit is 64 MiB)");
}

TEST_F(ProvidersTest, AnEndlessAnswerIsCutOff) {
  Add({"AnswersForever"});
  TRun const run = Run({"report", "--json"});
  EXPECT_EQ(run.fStatus, 2);
  EXPECT_EQ(FailureIn(JsonOf(run), "AnswersForever")["error"], "its result exceeds 268435456 bytes");
}

// ---- Interrupts and the terminal ----

TEST_F(ProvidersTest, AnInterruptLeavesNoProcess) {
  Add({"Hangs"});
  pid_t const zep = StartReport();
  WaitFor("Hangs");
  ::kill(zep, SIGINT);
  int status = 0;
  ::waitpid(zep, &status, 0);
  EXPECT_TRUE(WIFSIGNALED(status) && WTERMSIG(status) == SIGINT);
  ExpectNoProcess("Hangs");
}

TEST_F(ProvidersTest, APlugInThatKillsZepLeavesNoProcess) {
  Add({"KillsItsOwner"});
  int status = 0;
  ::waitpid(StartReport(), &status, 0);
  EXPECT_TRUE(WIFSIGNALED(status) && WTERMSIG(status) == SIGKILL);
  ExpectNoProcess("KillsItsOwner");
}

// As after Ctrl-Z: zep continues where it was stopped.
TEST_F(ProvidersTest, ZepThatAPlugInStopsContinues) {
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

TEST_F(ProvidersTest, ProgressIsShownOnATerminalOnly) {
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
