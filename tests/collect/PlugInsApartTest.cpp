// SPDX-License-Identifier: Apache-2.0
#include "collect/PlugInsApart.h"

#include "tests/Machines.h"
#include "tests/Support.h"
#include "tests/collect/SamplePlugIns.h"
#include "tests/collect/answer/DumpOf.h"
#include "tests/collect/answer/RandomNamespace.h"

#include <fcntl.h>
#include <gmock/gmock.h>
#include <signal.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <cstdio>
#include <cstring>
#include <memory>
#include <thread>

namespace NQRVZEP20 {
namespace {

namespace fs = std::filesystem;
using testing::AllOf;
using testing::Contains;
using testing::HasSubstr;
using testing::StartsWith;

using TLines = std::vector<std::string>;

// ---- The same answers as in this process ----

TEST(PlugInsApartTest, TheAnswersAreThoseOfThePlugInsInThisProcess) {
  TRecordedMachine const machine("server");  // counters of this machine would change between the two
  TEnvironmentGuard const root("ZEP_ROOT", machine.Root().c_str());
  auto const apart = LoadPlugInsApart(TheSample());  // first: a plug-in that is loaded here registers only once
  auto const& here = SamplePlugIns();
  ASSERT_EQ(apart.size(), here.size());
  for (std::size_t n = 0; n < here.size(); ++n) {
    EXPECT_EQ(apart[n].fName, here[n].fName);
    EXPECT_EQ(apart[n].fFile, here[n].fFile);
    EXPECT_FALSE(apart[n].HasFailed());
    ASSERT_EQ(apart[n].fProviders.size(), here[n].fProviders.size());
    for (std::size_t m = 0; m < here[n].fProviders.size(); ++m) {
      TNamespaceView const &one = *apart[n].fProviders[m].fView, &other = *here[n].fProviders[m].fView;
      EXPECT_EQ(one.GetProviderName(), other.GetProviderName());
      EXPECT_EQ(one.GetSampleLabel(), other.GetSampleLabel());
      EXPECT_EQ(DumpOf(*one.Get()), DumpOf(*other.Get()));
      EXPECT_GT(apart[n].fProviders[m].fMilliseconds, 0);
    }
  }
}

TEST(PlugInsApartTest, RandomNamespacesAnswerAsInThisProcess) {
  auto const plugIns = LoadPlugInsApart({TPlugInFile{"Random", RANDOM_PROVIDERS}});
  ASSERT_EQ(plugIns.size(), 1u);
  ASSERT_EQ(plugIns[0].fProviders.size(), kRandomProviders);
  for (TProviderRun const& provider : plugIns[0].fProviders) {
    ASSERT_TRUE(provider.fView) << provider.fError;
    auto const seed = static_cast<unsigned int>(std::stoul(provider.fName.substr(std::strlen("Random"))));
    EXPECT_EQ(DumpOf(*provider.fView->Get()), DumpOf(*RandomNamespace(seed))) << seed;
  }
}

// ---- Plug-ins that misbehave ----

class PlugInsApartMisdeedTest : public testing::Test {
protected:
  PlugInsApartMisdeedTest() { fs::copy(TEST_LIBZEPCORE, fDir.Path("libzepcore.so")); }

  void Add(std::vector<std::string> const& names) {
    for (std::string const& name : names) fs::copy(MISBEHAVES, fDir.Path("lib" + name + ".nsp.so"));
  }

  std::string Environment() const { return "LD_LIBRARY_PATH=" + fDir.Path() + " ZEP_MISDEEDS=" + fDir.Path() + " "; }

  // `before`: shell commands for the process that then becomes the program.
  TLines List(std::string const& options, std::string const& before = "") const {
    return LinesOf(before + Environment() + LISTS_PLUG_INS + " --apart " + options + " 2>&1");
  }

  static TLines LinesOf(std::string const& command) {
    std::unique_ptr<FILE, int (*)(FILE*)> const pipe(::popen(command.c_str(), "r"), ::pclose);
    TLines lines(1);
    for (int c; (c = std::fgetc(pipe.get())) != EOF;)
      if (c == '\n')
        lines.emplace_back();
      else
        lines.back() += static_cast<char>(c);
    return lines;
  }

  // "provider Crashes: why (fill, libCrashes.nsp.so)", with the part after it.
  static std::string InFill(std::string const& name, std::string const& why, std::string const& end = "") {
    return "provider " + name + ": " + why + " (fill, lib" + name + ".nsp.so)" + end;
  }
  static std::string InLoad(std::string const& name, std::string const& why, std::string const& stage) {
    return "plug-in " + name + ": " + why + " (" + stage + ", lib" + name + ".nsp.so)";
  }
  static std::string Filled(std::string const& name) { return "provider " + name + ": filled root/" + name + " (1)"; }

  // Waits until the process of the file has ended.
  void ExpectNoProcess(std::string const& file) const {
    std::string const id = ReadFile(fDir.Path(file));
    ASSERT_FALSE(id.empty()) << file;
    for (int tries = 0; fs::exists("/proc/" + id) && tries < 6000; ++tries) ::usleep(10000);
    EXPECT_FALSE(fs::exists("/proc/" + id)) << file;
  }

  TTempDir const fDir;
};

TEST_F(PlugInsApartMisdeedTest, APlugInThatDiesCostsOnlyItsOwnRow) {
  TLines const expected = {
      InFill("Throws", "kZEPStatusAccessDenied (no disk)", "; last log line: [Error] the disk is gone"),
      InFill("ThrowsInAThread", "in a thread"),
      InFill("ThrowsWhileItMayNot", "it may not"),
      InFill("Crashes", "it was killed by SIGSEGV (Segmentation fault)", "; last log line: [Error] about to crash"),
      InFill("Aborts", "it was killed by SIGABRT (Aborted)"),
      InFill("Exits", "it exited with status 0"),
      InFill("ExitsAtOnce", "it exited with status 7"),
      InFill("Executes", "it exited with status 9"),
      InFill("Kills", "it was killed by SIGTERM (Terminated)"),
      InFill("Closes", "it closed the descriptor for its result"),
      InLoad("LoadThrows", "no disk today", "static construction"),
      InLoad("LoadThrowsANumber", "it threw an object that is not a std::exception", "static construction"),
      InLoad("LoadCrashes", "it was killed by SIGSEGV (Segmentation fault)", "static construction"),
      InLoad("LoadExits", "it exited with status 3", "static construction"),
      InLoad("LoadAborts", "it was killed by SIGABRT (Aborted)", "static construction"),
      InLoad("LoadCloses", "it closed the descriptor for its result", "static construction"),
      InLoad("RegistrationThrows", "it has no name", "registration"),
      InLoad("Broken", fDir.Path("libBroken.nsp.so") + ": file too short", "open"),
      Filled("Healthy"),
  };
  Add({"Throws", "ThrowsInAThread", "ThrowsWhileItMayNot", "Crashes", "Aborts", "Exits", "ExitsAtOnce", "Executes", "Kills",
       "Closes", "LoadThrows", "LoadThrowsANumber", "LoadCrashes", "LoadExits", "LoadAborts", "LoadCloses", "RegistrationThrows",
       "Healthy"});
  WriteFile(fDir.Path("libBroken.nsp.so"), "this is not a library");
  TLines const lines = List("");
  for (std::string const& line : expected) EXPECT_THAT(lines, Contains(line));
}

TEST_F(PlugInsApartMisdeedTest, APlugInThatHangsIsEndedWithAllThatItStarted) {
  TLines const expected = {
      InFill("Hangs", "it exceeded the time limit of 6 s"),
      "provider HangsAfter: not filled, because the plug-in process had ended (fill, libHangs.nsp.so)",
      InFill("HangsBlocked", "it exceeded the time limit of 6 s"),
      InFill("Stops", "it exceeded the time limit of 6 s"),
      InLoad("LoadHangs", "it exceeded the time limit of 6 s", "static construction"),
      InLoad("RegistrationHangs", "it exceeded the time limit of 6 s", "registration"),
  };
  Add({"Hangs", "HangsBlocked", "Stops", "LoadHangs", "RegistrationHangs"});
  TLines const lines = List("--timeout 6 --parallel 8");
  for (std::string const& line : expected) EXPECT_THAT(lines, Contains(line));
  ExpectNoProcess("Hangs");
  ExpectNoProcess("HangsBlocked");
}

TEST_F(PlugInsApartMisdeedTest, ProcessesThatAPlugInLeavesAreEnded) {
  Add({"Forks", "ForksTwice"});
  TLines const lines = List("");
  EXPECT_THAT(lines, Contains(Filled("Forks")));
  EXPECT_THAT(lines, Contains(Filled("ForksTwice")));
  ExpectNoProcess("Forks");
}

TEST_F(PlugInsApartMisdeedTest, NoProcessOutlivesTheOwner) {
  Add({"Hangs"});
  for (int const signal : {SIGKILL, SIGINT}) {
    fs::remove(fDir.Path("Hangs"));
    pid_t const owner = ::fork();
    if (owner == 0) {
      ::setenv("LD_LIBRARY_PATH", fDir.Path().c_str(), 1);
      ::setenv("ZEP_MISDEEDS", fDir.Path().c_str(), 1);
      ::execl(LISTS_PLUG_INS, LISTS_PLUG_INS, "--apart", nullptr);
      ::_exit(127);
    }
    for (int tries = 0; ReadFile(fDir.Path("Hangs")).empty() && tries < 6000; ++tries) ::usleep(10000);
    ::kill(owner, signal);
    ::waitpid(owner, nullptr, 0);
    ExpectNoProcess("Hangs");
  }
}

TEST_F(PlugInsApartMisdeedTest, APlugInThatHarmsItsSupervisorLeavesNoProcess) {
  Add({"KillsItsSupervisor", "StopsItsSupervisor", "StopsItsSupervisorAndReturns", "Healthy"});
  TLines const lines = List("--timeout 6 --parallel 8 --state");
  EXPECT_THAT(lines, Contains(InFill("KillsItsSupervisor", "its supervisor process died")));
  EXPECT_THAT(
      lines, Contains(InFill("StopsItsSupervisor", "it exceeded the time limit of 6 s, and has stopped its supervisor process")));
  EXPECT_THAT(lines, Contains(InLoad("StopsItsSupervisorAndReturns", "it has stopped its supervisor process", "fill")));
  EXPECT_THAT(lines, Contains(Filled("StopsItsSupervisorAndReturns")));
  EXPECT_THAT(lines, Contains(Filled("Healthy")));
  EXPECT_THAT(lines, Contains("children left: 0"));
  ExpectNoProcess("KillsItsSupervisor");
  ExpectNoProcess("StopsItsSupervisor");
}

TEST_F(PlugInsApartMisdeedTest, TheOwnerKeepsNeitherDescriptorsNorChildren) {
  Add({"Throws", "Crashes", "Exits", "Closes", "LoadThrows", "LoadCrashes", "Forks", "Healthy", "KillsItsSupervisor"});
  TLines const lines = List("--state");
  EXPECT_THAT(lines, Contains("descriptors left: 0"));
  EXPECT_THAT(lines, Contains("children left: 0"));
}

// ---- Time limits ----

TEST_F(PlugInsApartMisdeedTest, MessagesOfAPlugInDoNotExtendItsTime) {
  Add({"SaysLoaded", "SaysDone"});
  TLines const lines = List("--timeout 6 --parallel 2");
  EXPECT_THAT(lines, Contains(InFill("SaysLoaded", "it exceeded the time limit of 6 s")));
  EXPECT_THAT(lines, Contains(InFill("SaysDone", "its result ended before its namespace was complete")));
}

TEST_F(PlugInsApartMisdeedTest, TheTimeInWhichTheOwnerIsStoppedDoesNotCount) {
  Add({"AnswersLate"});
  std::thread stop([this] {
    for (int tries = 0; ReadFile(fDir.Path("AnswersLate")).empty() && tries < 6000; ++tries) ::usleep(10000);
    ::usleep(500'000);  // the owner has read that the plug-in is loaded
    pid_t const owner = std::stoi(ReadFile(fDir.Path("owner")));
    ::kill(owner, SIGSTOP);
    ::sleep(8);
    ::kill(owner, SIGCONT);
  });
  TLines const lines = List("--timeout 6", "echo $$ > " + fDir.Path("owner") + "; exec env ");
  stop.join();
  EXPECT_THAT(lines, Contains("provider AnswersLate: filled root/own (1)"));
}

TEST_F(PlugInsApartMisdeedTest, PlugInsWorkSideBySide) {
  Add({"WaitsForA", "WaitsForB"});
  TLines const lines = List("--timeout 30 --parallel 2");
  EXPECT_THAT(lines, Contains(Filled("WaitsForA")));
  EXPECT_THAT(lines, Contains(Filled("WaitsForB")));
}

// ---- Resources that are short ----

TEST_F(PlugInsApartMisdeedTest, StandardDescriptorsOfTheOwnerMayBeClosed) {
  Add({"Prints", "Reads", "Healthy"});
  TLines const lines = LinesOf(Environment() + LISTS_PLUG_INS + " --apart --timeout 20 <&- 2>&-");
  EXPECT_THAT(lines, Contains(Filled("Healthy")));
  EXPECT_THAT(lines, Contains("words Prints: words of 17 bytes"));
  EXPECT_THAT(lines, Contains("words Reads: read -1"));
}

// The owner has as many descriptors as it needs for the pipes, and no other.
TEST_F(PlugInsApartMisdeedTest, ThePlugInNeedsNoDescriptorsOfItsOwner) {
  if (kIsSanitized) GTEST_SKIP() << "a sanitizer has descriptors of its own";
  Add({"Crashes", "Healthy", "Reads"});
  auto const withLimit = [this](int limit) {
    return List("--timeout 20 --parallel 1", "ulimit -n " + std::to_string(limit) + "; echo data | ");
  };
  TLines lines;
  for (int limit = 8; limit < 100 && !testing::Value(lines, Contains(HasSubstr("Healthy: filled"))); ++limit) {
    lines = withLimit(limit);
    ASSERT_THAT(lines, testing::Not(Contains(HasSubstr("time limit"))));
  }
  EXPECT_THAT(lines, Contains(Filled("Healthy")));
  EXPECT_THAT(lines, Contains("words Reads: read -1"));
  EXPECT_THAT(lines, Contains(InFill("Crashes", "it was killed by SIGSEGV (Segmentation fault)",
                                     "; last log line: [Error] about to crash")));
}

// The owner and the supervisor are the two processes that the user may have.
TEST_F(PlugInsApartMisdeedTest, AProcessThatCannotBeStartedIsNamed) {
  if (::geteuid() != 0) GTEST_SKIP() << "only root can become a user without processes";
  Add({"Healthy"});
  fs::permissions(fDir.Path(), fs::perms::group_all, fs::perm_options::add);
  TLines const lines = List("--parallel 1", "exec setpriv --reuid 54321 --clear-groups prlimit --nproc=2 env ");
  EXPECT_THAT(lines, Contains(InLoad("Healthy", "no process could be started for it: Resource temporarily unavailable", "open")));
}

TEST_F(PlugInsApartMisdeedTest, NoCoreDumpIsLeft) {
  Add({"Crashes", "Aborts", "LoadCrashes", "PrintsItsState"});
  fs::create_directory(fDir.Path("cores"));
  std::string const inCores = "cd " + fDir.Path("cores") + " && ulimit -c unlimited; ";
  LinesOf(inCores + "sh -c 'kill -SEGV $$' 2>&1");
  bool const areWritten = !fs::is_empty(fDir.Path("cores"));
  for (auto const& core : fs::directory_iterator(fDir.Path("cores"))) fs::remove(core.path());
  TLines const lines = List("", inCores);
  EXPECT_THAT(lines, Contains("words PrintsItsState: core limit 1 of 1, dumpable 1, first without memory 500"));
  EXPECT_TRUE(fs::is_empty(fDir.Path("cores")));
  if (!areWritten) GTEST_SKIP() << "this system writes no core dumps into the working directory";
}

TEST_F(PlugInsApartMisdeedTest, WordsOfTheOwnerAreNotPrintedByAPlugIn) {
  Add({"Prints"});
  TLines const lines = List("--words");
  EXPECT_EQ(lines.front(), "words of the owner, plug-in Prints: ");
  EXPECT_THAT(lines, Contains("words Prints: words of 17 bytes"));
}

TEST_F(PlugInsApartMisdeedTest, ALongErrorAndALongLogLineAreCut) {
  Add({"LogsMuch"});
  TLines const lines = List("");
  EXPECT_THAT(lines, Contains(InFill("LogsMuch", std::string(1021, 'y') + "...",
                                     "; last log line: [Error] begin " + std::string(1007, 'x') + "...")));
}

TEST_F(PlugInsApartMisdeedTest, AnEndlessAnswerIsCutOff) {
  Add({"AnswersForever", "AnswersBroken"});
  TLines const lines = List("--answer 100000");
  EXPECT_THAT(lines, Contains(InFill("AnswersForever", "its result exceeds 100000 bytes")));
  EXPECT_THAT(lines, Contains("provider AnswersBroken: filled root/own (1)"));
}

// The end of the answer arrives together with the piece that is too long.
TEST_F(PlugInsApartMisdeedTest, AnAnswerThatIsSlightlyTooLongIsNotAcceptedInPart) {
  Add({"Healthy"});
  int limit = 50;
  TLines lines = List("--answer 50");
  for (; std::count(lines.begin(), lines.end(), Filled("Healthy")) == 0; lines = List("--answer " + std::to_string(limit))) {
    ASSERT_THAT(lines, Contains(InFill("Healthy", "its result exceeds " + std::to_string(limit) + " bytes")));
    ASSERT_LT(limit += 20, 5000);
  }
  EXPECT_GT(limit, 50);
}

TEST_F(PlugInsApartMisdeedTest, TheMemoryLimitEndsAPlugInThatFillsMemory) {
  if (kIsSanitized) GTEST_SKIP() << "a sanitizer reserves more address space than any limit";
  Add({"FillsMemory", "Healthy"});
  TLines const lines = List("--memory 64");
  EXPECT_THAT(lines, Contains(InFill("FillsMemory", "std::bad_alloc (the memory limit is 64 MiB)")));
  EXPECT_THAT(lines, Contains(Filled("Healthy")));
}

TEST_F(PlugInsApartMisdeedTest, WordsOfAPlugInAreCaught) {
  Add({"Prints", "PrintsMuch", "CrashesAfterWords", "Reads"});
  TLines const lines = List("");
  EXPECT_THAT(lines, Contains("words Prints: words of 17 bytes"));
  EXPECT_THAT(lines, Contains("and more"));
  EXPECT_THAT(lines, Contains("words PrintsMuch: line 0"));
  EXPECT_THAT(lines, Contains(testing::MatchesRegex("\\[[0-9]+ bytes omitted\\]")));
  EXPECT_THAT(lines, Contains("line 99999"));
  EXPECT_THAT(lines, Contains("words CrashesAfterWords: last words"));
  EXPECT_THAT(lines, Contains("words Reads: read -1"));
}

TEST_F(PlugInsApartMisdeedTest, ChangesOfAProcessStayInIt) {
  Add({"ChangesDirectory", "LimitsItself", "Healthy"});
  mode_t const mask = ::umask(0);
  ::umask(mask);
  TLines const lines = List("--parallel 1 --state", "unset ZEP_HOST_NAME; ");
  for (char const* name : {"ChangesDirectory", "LimitsItself", "Healthy"}) EXPECT_THAT(lines, Contains(Filled(name)));
  EXPECT_THAT(lines, Contains("directory: " + fs::current_path().string()));
  EXPECT_THAT(lines, Contains("umask: " + std::to_string(mask)));
  EXPECT_THAT(lines, Contains("ZEP_HOST_NAME: not set"));
}

TEST_F(PlugInsApartMisdeedTest, OfTwoProvidersWithOneNameTheFirstCounts) {
  Add({"TwinA", "TwinB", "RegistersTwice", "RegistersNothing"});
  TLines const lines = List("");
  EXPECT_THAT(lines, Contains("provider Twin: filled root/TwinA (1)"));
  EXPECT_THAT(lines, Contains("provider Twin: the name Twin is already registered by libTwinA.nsp.so (registration, "
                              "libTwinB.nsp.so)"));
  EXPECT_THAT(lines, Contains(Filled("RegistersTwice")));
  EXPECT_THAT(lines,
              Contains("provider RegistersTwice: the plug-in registers this name twice; the second registration is ignored "
                       "(registration, libRegistersTwice.nsp.so)"));
  EXPECT_THAT(lines, Contains("plug-in RegistersNothing: "));
}

TEST_F(PlugInsApartMisdeedTest, OfTwoProvidersWithOneNameTheSecondCountsWhenTheFirstFails) {
  Add({"TwinThrows", "TwinZ"});
  TLines const lines = List("");
  EXPECT_THAT(lines, Contains("provider Twin: no twin today; the name Twin is then registered by libTwinZ.nsp.so, which "
                              "is used instead (fill, libTwinThrows.nsp.so)"));
  EXPECT_THAT(lines, Contains("provider Twin: filled root/TwinZ (1)"));
}

TEST_F(PlugInsApartMisdeedTest, OfTwoProvidersWithOneNameBothAreNamedWhenTheSecondFails) {
  Add({"TwinA", "TwinThrows"});
  TLines const lines = List("");
  EXPECT_THAT(lines, Contains("provider Twin: filled root/TwinA (1)"));
  EXPECT_THAT(lines, Contains("provider Twin: no twin today; the name Twin is already registered by libTwinA.nsp.so "
                              "(fill, libTwinThrows.nsp.so)"));
}

TEST_F(PlugInsApartMisdeedTest, OfTwoFilesWithOneNameThePathIsNamed) {
  std::vector<TPlugInFile> files;
  for (char const* directory : {"a", "b"}) {
    fs::create_directory(fDir.Path(directory));
    files.push_back({"Healthy", fDir.Path(std::string(directory) + "/libHealthy.nsp.so")});
    fs::copy(MISBEHAVES, files.back().fFile);
  }
  std::vector<TPlugIn> const plugIns = LoadPlugInsApart(files);
  ASSERT_EQ(plugIns.size(), 2u);
  EXPECT_FALSE(plugIns[0].HasFailed());
  ASSERT_EQ(plugIns[1].fProviders.size(), 1u);
  EXPECT_EQ(plugIns[1].fProviders[0].fError, "the name Healthy is already registered by " + files[0].fFile);
  EXPECT_EQ(plugIns[1].fProviders[0].fView, nullptr);
}

TEST_F(PlugInsApartMisdeedTest, AProviderThatIsRegisteredDuringTheFillIsNotFilled) {
  Add({"RegistersLate"});
  TLines const lines = List("");
  EXPECT_THAT(lines, Contains(Filled("RegistersLate")));
  EXPECT_THAT(lines, Contains("provider Late: not filled, because it was registered after the plug-in had been loaded (fill, "
                              "libRegistersLate.nsp.so)"));
}

TEST_F(PlugInsApartMisdeedTest, WhatAPlugInLogsIsLoggedHere) {
  Add({"Throws", "Crashes"});
  TLines const lines = List("--log");
  EXPECT_THAT(lines, Contains("log: about to crash"));
  EXPECT_THAT(lines, Contains("log: the disk is gone"));
}

TEST_F(PlugInsApartMisdeedTest, ResultsAreInTheOrderOfTheNames) {
  Add({"Healthy", "A", "Z", "M", "Exits"});
  TLines plugIns;
  for (std::string const& line : List("--parallel 3"))
    if (line.rfind("plug-in ", 0) == 0) plugIns.push_back(line);
  EXPECT_EQ(plugIns, (TLines{"plug-in A: ", "plug-in Exits: ", "plug-in Healthy: ", "plug-in M: ", "plug-in Z: "}));
}

}  // namespace
}  // namespace NQRVZEP20
