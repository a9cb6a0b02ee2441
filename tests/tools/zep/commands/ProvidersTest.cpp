// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/commands/Providers.h"

#include "tests/tools/zep/commands/MisbehavingPlugIns.h"

#include <gmock/gmock.h>
#include <sys/resource.h>

#include <regex>

namespace NQRVZEP20::zep {
namespace {

using testing::AllOf;
using testing::Contains;
using testing::HasSubstr;

using ProvidersTest = TMisbehavingPlugInsTest;

// The times of the reports and of the plug-ins, and those that clocks show, differ.
std::string WithoutTimes(std::string const& text) {
  std::string const report = std::regex_replace(text, std::regex("\"time\": \"[^\"]*\""), "\"time\": N");
  std::string const json = std::regex_replace(report, std::regex("\"milliseconds\": [0-9.e+-]+"), "\"milliseconds\": N");
  std::string const clocks = std::regex_replace(json, std::regex("(\"Seconds\": \\{[^}]*\"value\": )\"[0-9]+\""), "$1N");
  return std::regex_replace(clocks, std::regex(" *[0-9]+\\.[0-9] ms *"), " N ms");
}
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
      {"AnswersBroken", "fill",
       "its answer is incomplete: the property no name: \xef\xbf\xbd of an instance of X_Own: its type does not exist", nullptr},
      {"RegistersNull", "registration", "kZEPStatusFail (it registers an empty pointer)", nullptr},
  };
  for (TRow const& row : rows) Add({row.fName});
  std::vector<std::string> const harmless = {
      "ChangesDirectory",     "LimitsItself",          "Prints", "Forks", "ForksTwice", "Reads",
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

TEST_F(ProvidersTest, TheDocumentsHaveTheCauseOfAFailureAsFields) {
  struct TRow {
    char const* fName;
    nlohmann::json fSignal, fExitStatus, fException;
  } const rows[] = {
      {"Crashes", "SIGSEGV", nullptr, nullptr},
      {"LoadAborts", "SIGABRT", nullptr, nullptr},
      {"Exits", nullptr, 0, nullptr},
      {"ExitsAtOnce", nullptr, 7, nullptr},
      {"Throws", nullptr, nullptr, "kZEPStatusAccessDenied (no disk)"},
      {"LoadThrows", nullptr, nullptr, "no disk today"},
      {"ThrowsInAThread", nullptr, nullptr, "in a thread"},
      {"Terminates", nullptr, nullptr, nullptr},
      {"HasNoNamespace", nullptr, nullptr, nullptr},
  };
  for (TRow const& row : rows) Add({row.fName});
  auto const document = JsonOf(Run({"report", "--json"}));
  auto const files = JsonOf(Run({"plugins", "--json"}));
  nlohmann::json plugIns;
  for (auto const& file : files["files"])
    if (!file["plugIn"].is_null()) plugIns["plugIns"].push_back(file["plugIn"]);
  for (TRow const& row : rows)
    for (auto const& failure : {FailureIn(document, row.fName), FailureIn(plugIns, row.fName)}) {
      SCOPED_TRACE(row.fName);
      EXPECT_EQ(failure["signal"], row.fSignal);
      EXPECT_EQ(failure["exitStatus"], row.fExitStatus);
      EXPECT_EQ(failure["exception"], row.fException);
      EXPECT_TRUE(failure["limit"].is_null());
    }
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

TEST_F(ProvidersTest, APlugInWithAValueThatCannotBeReadFailsButTheRestOfItsAnswerIsUsed) {
  Add({"AnswersBroken"});
  std::string const error =
      "its answer is incomplete: the property no name: \\xff of an instance of X_Own: its type does not exist";
  TRun const report = Run({"report"});
  EXPECT_EQ(report.fStatus, 2);
  std::string const words = std::regex_replace(report.fOutput, std::regex("\\s+"), " ");
  EXPECT_THAT(words, HasSubstr("provider AnswersBroken failed: " + error + " (fill, libAnswersBroken.nsp.so)"));
  EXPECT_EQ(Run({"plugins"}).fStatus, 2);
  TRun const show = Run({"show", "X_Own"});
  EXPECT_EQ(show.fStatus, 2);
  EXPECT_THAT(show.fOutput, HasSubstr("root/own:X_Own"));
  EXPECT_THAT(show.fErrors, HasSubstr(error));
}

}  // namespace
}  // namespace NQRVZEP20::zep
