// SPDX-License-Identifier: Apache-2.0
#include "TOSSpecific.h"
#include "tests/os/HostTools.h"
#include "tests/os/Programs.h"

#include <fcntl.h>
#include <signal.h>
#include <sys/mman.h>
#include <sys/resource.h>
#include <sys/stat.h>

#include <atomic>
#include <chrono>
#include <functional>
#include <map>

namespace NQRVZEP20 {
namespace {

using TArguments = std::vector<std::string>;
using TEntries = std::vector<std::string>;
using namespace std::chrono_literals;

constexpr int kForEver = -1;

struct TRun {
  int fResult;
  std::string fOutput;
  std::chrono::milliseconds fTime;
};

// Runs a program of tests/os/children.
TRun RunChild(std::string const& name, TArguments const& arguments = {}, int timeout = kForEver) {
  TRun run;
  auto const start = std::chrono::steady_clock::now();
  run.fResult = TOSSpecific::SpawnProcess(Child(name), arguments, run.fOutput, timeout);
  run.fTime = std::chrono::duration_cast<std::chrono::milliseconds>(std::chrono::steady_clock::now() - start);
  return run;
}

// Every child must be waited for, unless a test states otherwise.
class SpawnProcessTest : public testing::Test {
protected:
  void TearDown() override { EXPECT_FALSE(HasChildren()); }
};

// Ends the child that printed its number, and waits for it.
void EndChild(std::string const& output) {
  pid_t const child = std::stoi(output);
  int status = 0;
  ASSERT_GT(child, 0);
  EXPECT_EQ(::waitpid(child, &status, WNOHANG), 0) << "the child should still run";
  EXPECT_EQ(::kill(child, SIGKILL), 0);
  EXPECT_EQ(::waitpid(child, &status, 0), child);
}

// ---- Results and output ----

TEST_F(SpawnProcessTest, ReportsOnlyWhetherTheChildExitedWithZero) {
  struct TRow {
    std::string fChild;
    TArguments fArguments;
    int fResult;
    std::string fOutput;
  };
  TRow const rows[] = {
      {"PrintsNothing", {}, 0, ""},
      {"ExitsWith3", {}, -1, "done\n"},
      {"PrintsToBoth", {}, 0, "out1 err1 out2 err2"},
      {"PrintsAfterClosingStandardError", {}, 0, "error|output"},
      {"DiesBySignal", {"9"}, -1, "last words"},
      {"DiesBySignal", {"15"}, -1, "last words"},
      {"LeavesAGrandchild", {}, 0, "child|grandchild"},
      {"RunsOnAfterClosingItsOutput", {"0"}, 0, "closing"},
      {"RunsOnAfterClosingItsOutput", {"4"}, -1, "closing"},
      {"RunsOnAfterClosingItsOutput", {"256"}, 0, "closing"},
      {"PrintsArguments", {"a", "", "b c", "*", "\"$HOME\""}, 0, "[" + Child("PrintsArguments") + "][a][][b c][*][\"$HOME\"]"},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fChild);
    TRun const run = RunChild(row.fChild, row.fArguments);
    EXPECT_EQ(run.fResult, row.fResult);
    EXPECT_EQ(run.fOutput, row.fOutput);
  }
}

TEST_F(SpawnProcessTest, AppendsToTheOutput) {
  std::string output = "before|";
  EXPECT_EQ(TOSSpecific::SpawnProcess(Child("ExitsWith3"), {}, output, kForEver), -1);
  EXPECT_EQ(output, "before|done\n");
  EXPECT_EQ(TOSSpecific::SpawnProcess(Child("PrintsNothing"), {}, output, kForEver), 0);
  EXPECT_EQ(output, "before|done\n");
  EXPECT_EQ(TOSSpecific::SpawnProcess(Child("PrintsToBoth"), {}, "child", {}, output, kForEver), 0);
  EXPECT_EQ(output, "before|done\nout1 err1 out2 err2");
}

TEST_F(SpawnProcessTest, WaitsForTheLastHolderOfTheOutput) {
  EXPECT_GE(RunChild("LeavesAGrandchild").fTime, 450ms);
  EXPECT_GE(RunChild("RunsOnAfterClosingItsOutput", {"0"}).fTime, 250ms);
}

TEST_F(SpawnProcessTest, CapturesTwentyMegabytes) {
  constexpr std::size_t kLength = 20 * 1000 * 1000;
  TRun const run = RunChild("PrintsALot", {std::to_string(kLength)});
  EXPECT_EQ(run.fResult, 0);
  ASSERT_EQ(run.fOutput.size(), kLength);
  for (std::size_t i = 0; i < kLength; ++i)
    if (run.fOutput[i] != static_cast<char>('a' + i % 26000 % 26)) FAIL() << "wrong at " << i;
}

TEST_F(SpawnProcessTest, ZeroByteCutsOffTheRestOfItsChunk) {
  EXPECT_EQ(RunChild("PrintsZeroByte").fOutput, "before|next");
  // 10000 bytes at once, the 101st of them zero: chunks of 4095, 4095 and 1810.
  EXPECT_EQ(RunChild("PrintsZeroByteAmongMany").fOutput, std::string(100 + 4095 + 1810, 'x'));
}

// Replaces standard input with a pipe that contains only this text, and whose end is not reached before End.
class TTypedInput {
public:
  explicit TTypedInput(std::string const& text = "") : fOld(::fcntl(0, F_DUPFD_CLOEXEC, 3)) {
    int ends[2];
    if (fOld < 0 || ::pipe2(ends, O_CLOEXEC) != 0) throw std::runtime_error("no pipe");
    ::dup2(ends[0], 0);
    ::close(ends[0]);
    fWriteEnd = ends[1];
    if (::write(fWriteEnd, text.data(), text.size()) != static_cast<ssize_t>(text.size())) throw std::runtime_error("no room");
  }
  ~TTypedInput() {
    End();
    ::dup2(fOld, 0);
    ::close(fOld);
  }
  TTypedInput(TTypedInput const&) = delete;
  TTypedInput& operator=(TTypedInput const&) = delete;

  void End() {
    if (fWriteEnd >= 0) ::close(fWriteEnd);
    fWriteEnd = -1;
  }

private:
  int fOld, fWriteEnd;
};

TEST_F(SpawnProcessTest, StandardInputIsTheCallers) {
  TTypedInput input("typed");
  input.End();
  EXPECT_EQ(RunChild("EchoesItsInput").fOutput, "typed");
}

// ---- The program ----

TEST_F(SpawnProcessTest, ArgumentZeroAndEnvironmentAreThoseGiven) {
  std::string output;
  EXPECT_EQ(TOSSpecific::SpawnProcess(Child("PrintsArguments"), {"x", ""}, "another name", {}, output, kForEver), 0);
  EXPECT_EQ(output, "[another name][x][]");

  output.clear();
  EXPECT_EQ(TOSSpecific::SpawnProcess(Child("PrintsEnvironment"), {}, "", {"A=1", "B=", "no equals"}, output, kForEver), 0);
  EXPECT_EQ(output, "[A=1][B=][no equals]");

  output.clear();
  EXPECT_EQ(TOSSpecific::SpawnProcess(Child("PrintsEnvironment"), {}, "", {}, output, kForEver), 0);
  EXPECT_EQ(output, "");
}

TEST_F(SpawnProcessTest, EnvironmentIsTheCallersWhereNoneIsGiven) {
  TEnvironmentGuard const variable("ZEP_TEST_VARIABLE", "seen by the child");
  EXPECT_NE(RunChild("PrintsEnvironment").fOutput.find("[ZEP_TEST_VARIABLE=seen by the child]"), std::string::npos);
}

TEST_F(SpawnProcessTest, OnlyTheFormWithoutEnvironmentSearchesThePath) {
  TEnvironmentGuard const path("PATH", ZEP_CHILDREN_DIR);
  std::string output;
  EXPECT_EQ(TOSSpecific::SpawnProcess("PrintsArguments", {"a"}, output, kForEver), 0);
  EXPECT_EQ(output, "[PrintsArguments][a]");
  output.clear();
  EXPECT_EQ(
      TOSSpecific::SpawnProcess("PrintsArguments", {"a"}, "name", {std::string("PATH=") + ZEP_CHILDREN_DIR}, output, kForEver),
      -1);
  EXPECT_EQ(output, "");
}

TEST_F(SpawnProcessTest, SearchContinuesAfterADirectoryWithoutTheProgram) {
  TTempDir const dir;
  WriteFile(dir.Path("PrintsArguments"), "not executable");
  TEnvironmentGuard const path("PATH", ("/nonexistent:" + dir.Path() + ":" ZEP_CHILDREN_DIR).c_str());
  EXPECT_EQ(TOSSpecific::SpawnProcess("PrintsArguments", {}, kForEver), "[PrintsArguments]");
}

TEST_F(SpawnProcessTest, AScriptWithoutItsInterpreterRunsInTheShellWhereThePathIsSearched) {
  TTempDir const dir;
  WriteFile(dir.Path("script"), "echo \"$0\" \"$1\"\n");
  ::chmod(dir.Path("script").c_str(), 0755);
  std::string output;
  EXPECT_EQ(TOSSpecific::SpawnProcess(dir.Path("script"), {"one"}, output, kForEver), 0);
  EXPECT_EQ(output, dir.Path("script") + " one\n");
  output.clear();
  EXPECT_EQ(TOSSpecific::SpawnProcess(dir.Path("script"), {"one"}, "script", {}, output, kForEver), -1);
  EXPECT_EQ(output, "");
}

TEST_F(SpawnProcessTest, AProgramThatCannotBeExecutedIsMinusOneAndNoException) {
  TTempDir const dir;
  WriteFile(dir.Path("file"), "text");
  for (std::string const& program : {std::string("/nonexistent"), std::string("nonexistent-program"), dir.Path("file"),
                                     dir.Path(), std::string(), std::string(5000, 'x'), "/" + std::string(5000, 'x')}) {
    SCOPED_TRACE(program.substr(0, 40));
    std::string output;
    EXPECT_EQ(LogOf([&] { EXPECT_EQ(TOSSpecific::SpawnProcess(program, {"a"}, output, kForEver), -1); }),
              (TEntries{"[Debug] SpawnProcess: process " + program}));
    EXPECT_EQ(TOSSpecific::SpawnProcess(program, {"a"}, "name", {}, output, kForEver), -1);
    EXPECT_EQ(output, "");
  }
}

TEST_F(SpawnProcessTest, ManyAndLongArgumentsArriveComplete) {
  TArguments arguments;
  std::string expected = "[" + Child("PrintsArguments") + "]";
  for (int i = 0; i < 2000; ++i) {
    arguments.push_back(std::string(static_cast<std::size_t>(i % 100), 'x'));
    expected += "[" + arguments.back() + "]";
  }
  EXPECT_EQ(RunChild("PrintsArguments", arguments).fOutput, expected);
}

TEST_F(SpawnProcessTest, StringFormReturnsTheOutputWhateverTheResult) {
  EXPECT_EQ(TOSSpecific::SpawnProcess(Child("ExitsWith3"), TArguments{}, kForEver), "done\n");
  EXPECT_EQ(TOSSpecific::SpawnProcess(Child("PrintsArguments"), TArguments{"a b"}, kForEver),
            "[" + Child("PrintsArguments") + "][a b]");
  EXPECT_EQ(TOSSpecific::SpawnProcess("/nonexistent", TArguments{}, kForEver), "");
}

TEST_F(SpawnProcessTest, CommandLineIsCutAtEverySingleBlank) {
  std::string const name = Child("PrintsArguments");
  struct TRow {
    std::string fCommandLine, fOutput;
  };
  TRow const rows[] = {
      {name, ""},
      {name + " a", "[a]"},
      {name + " a b", "[a][b]"},
      {name + "  a", "[][a]"},
      {name + " a   b", "[a][][][b]"},
      {name + " ", "[]"},
      {name + " a ", "[a][]"},
      {name + " 'a b' \"c\" \\ d", "['a][b'][\"c\"][\\][d]"},
      {name + " a\tb\nc", "[a\tb\nc]"},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fCommandLine);
    EXPECT_EQ(TOSSpecific::SpawnProcess(row.fCommandLine, kForEver), "[" + name + "]" + row.fOutput);
  }
  EXPECT_EQ(TOSSpecific::SpawnProcess(" " + name, kForEver), "");  // an empty program
  EXPECT_EQ(TOSSpecific::SpawnProcess("", kForEver), "");
}

// ---- Messages ----

TEST_F(SpawnProcessTest, LogsTheCall) {
  std::string output;
  EXPECT_EQ(LogOf([&] {
              TOSSpecific::SpawnProcess(Child("PrintsNothing"), {"a", "", "b c"}, "zero", {"A=1", "B=2"}, output, kForEver);
            }),
            (TEntries{"[Debug] TOSSpecific::SpawnProcess calling " + Child("PrintsNothing") +
                      "\nwith parameters zero a  b c \nwith envoirment vars A=1 B=2 "}));
  EXPECT_EQ(LogOf([&] { TOSSpecific::SpawnProcess(Child("PrintsNothing"), {}, "", {}, output, kForEver); }),
            (TEntries{"[Debug] TOSSpecific::SpawnProcess calling " + Child("PrintsNothing") +
                      "\nwith parameters  \nwith envoirment vars "}));
  EXPECT_EQ(LogOf([&] { RunChild("PrintsNothing", {"a"}); }),
            (TEntries{"[Debug] SpawnProcess: process " + Child("PrintsNothing")}));
  EXPECT_EQ(LogOf([&] { RunChild("ExitsWith3"); }), (TEntries{"[Debug] SpawnProcess: process " + Child("ExitsWith3")}));
}

TEST_F(SpawnProcessTest, AChildEndedByASignalIsLogged) {
  for (char const* signal : {"9", "15", "6"})  // that of 6 may be marked as one that left a core
    EXPECT_EQ(LogOf([signal] { EXPECT_EQ(RunChild("DiesBySignal", {signal}).fResult, -1); }),
              (TEntries{"[Debug] SpawnProcess: process " + Child("DiesBySignal"),
                        "[Debug] ERROR: SpawnProcess - Child process exited abnormally!"}));
}

// ---- The time-out ----

TEST_F(SpawnProcessTest, TimeoutLimitsSilenceAndLeavesTheChildAlive) {
  TRun run;
  EXPECT_EQ(LogOf([&] { run = RunChild("StaysSilent", {}, 3); }),
            (TEntries{"[Debug] SpawnProcess: process " + Child("StaysSilent"),
                      "[Debug] ERROR: SpawnProcess - " + Child("StaysSilent") + " TimeOut!"}));
  EXPECT_EQ(run.fResult, -1);
  EXPECT_GE(run.fTime, 2990ms);
  EXPECT_LT(run.fTime, 15s);
  EndChild(run.fOutput);  // the output before the silence is kept
}

TEST_F(SpawnProcessTest, TimeoutOfTheFormWithEnvironmentNamesItsPath) {
  std::string output;
  TEntries const entries =
      LogOf([&] { EXPECT_EQ(TOSSpecific::SpawnProcess(Child("StaysSilent"), {}, "zero", {}, output, 3), -1); });
  ASSERT_EQ(entries.size(), 2u);
  EXPECT_EQ(entries[1], "[Debug] ERROR: SpawnProcess - " + Child("StaysSilent") + " TimeOut!");
  EndChild(output);
}

TEST_F(SpawnProcessTest, TimeoutOfZeroAllowsNoSilenceAtAll) {
  std::string output;
  EXPECT_EQ(RunChild("TalksSlowly", {"3000", "1"}, 0).fResult, -1);
  EXPECT_GT(::wait(nullptr), 0);
}

TEST_F(SpawnProcessTest, AChildThatKeepsTalkingIsNeverTimedOut) {
  TRun const run = RunChild("TalksSlowly", {"1300", "5"}, 5);
  EXPECT_EQ(run.fResult, 0);
  EXPECT_EQ(run.fOutput, ".....");
  EXPECT_GE(run.fTime, 6400ms);
}

TEST_F(SpawnProcessTest, TimeoutOfMinusOneWaitsForEver) {
  TRun const run = RunChild("TalksSlowly", {"1500", "1"}, kForEver);
  EXPECT_EQ(run.fResult, 0);
  EXPECT_GE(run.fTime, 1450ms);
}

TEST_F(SpawnProcessTest, AnyOtherNegativeTimeoutIsAFailureOfSelect) {
  TRun run;
  EXPECT_EQ(
      LogOf([&] { run = RunChild("PrintsNothing", {}, -2); }),
      (TEntries{"[Debug] SpawnProcess: process " + Child("PrintsNothing"), "[Debug] ERROR: SpawnProcess - select call failed!"}));
  EXPECT_EQ(run.fResult, -1);
  EXPECT_GT(::wait(nullptr), 0);  // it has not been waited for
}

// ---- Signals ----

void Ignored(int) {}

// Handles SIGUSR1 in that way until it is destroyed.
class TSignalAction {
public:
  explicit TSignalAction(void (*handler)(int), int number = SIGUSR1) : fNumber(number) {
    struct sigaction action {};
    action.sa_handler = handler;
    ::sigaction(number, &action, &fOld);
  }
  ~TSignalAction() { ::sigaction(fNumber, &fOld, nullptr); }

private:
  int fNumber;
  struct sigaction fOld;
};

TEST_F(SpawnProcessTest, AnInterruptedSelectIsNotRetried) {
  TSignalAction const action(Ignored);
  TRun run;
  EXPECT_EQ(
      LogOf([&] {
        std::atomic<bool> done{false};
        std::thread interrupter([&done, spawner = ::pthread_self()] {
          std::this_thread::sleep_for(1s);
          while (!done) {
            ::pthread_kill(spawner, SIGUSR1);
            std::this_thread::sleep_for(100ms);
          }
        });
        run = RunChild("StaysSilent");
        done = true;
        interrupter.join();
      }),
      (TEntries{"[Debug] SpawnProcess: process " + Child("StaysSilent"), "[Debug] ERROR: SpawnProcess - select call failed!"}));
  EXPECT_EQ(run.fResult, -1);
  EndChild(run.fOutput);
}

TEST_F(SpawnProcessTest, SignalStateIsThatOfForkAndExec) {
  TSignalAction const caught(Ignored, SIGUSR1), ignored(SIG_IGN, SIGUSR2);
  EXPECT_EQ(RunChild("PrintsSignals").fOutput, "open,default;open,ignored;");

  sigset_t both, old;
  ::sigemptyset(&both);
  ::sigaddset(&both, SIGUSR1);
  ::sigaddset(&both, SIGUSR2);
  ::pthread_sigmask(SIG_BLOCK, &both, &old);
  EXPECT_EQ(RunChild("PrintsSignals").fOutput, "blocked,default;blocked,ignored;");
  ::pthread_sigmask(SIG_SETMASK, &old, nullptr);
}

TEST_F(SpawnProcessTest, SignalStateOfTheCallerStaysAsItWas) {
  TSignalAction const caught(Ignored, SIGUSR1);
  sigset_t one, before, after;
  ::sigemptyset(&one);
  ::sigaddset(&one, SIGUSR2);
  ::pthread_sigmask(SIG_BLOCK, &one, &before);
  RunChild("PrintsNothing");
  TOSSpecific::SpawnProcess("/nonexistent", kForEver);
  struct sigaction action;
  ::sigaction(SIGUSR1, nullptr, &action);
  EXPECT_EQ(action.sa_handler, &Ignored);
  ::pthread_sigmask(SIG_SETMASK, &before, &after);
  for (int number = 1; number < 32; ++number)
    EXPECT_EQ(::sigismember(&after, number), number == SIGUSR2 ? 1 : ::sigismember(&before, number)) << number;
}

TEST_F(SpawnProcessTest, AChildThatCannotBeWaitedForIsAFailureOfWaitpid) {
  TSignalAction const action(SIG_IGN, SIGCHLD);  // the kernel takes the child's status itself
  EXPECT_EQ(
      LogOf([] { EXPECT_EQ(RunChild("ExitsWith3").fOutput, "done\n"); }),
      (TEntries{"[Debug] SpawnProcess: process " + Child("ExitsWith3"), "[Debug] ERROR: SpawnProcess - waitpid call failed!"}));
}

// ---- Descriptors ----

// The descriptors of this process above standard error that remain open after exec, in the format of PrintsDescriptors.
std::string InheritableDescriptors() {
  std::map<int, std::string> names;
  for (auto const& entry : std::filesystem::directory_iterator("/proc/self/fd")) {
    int const fd = std::stoi(entry.path().filename());
    int const flags = ::fcntl(fd, F_GETFD);
    std::error_code gone;
    if (fd > 2 && flags != -1 && (flags & FD_CLOEXEC) == 0) names[fd] = std::filesystem::read_symlink(entry, gone);
  }
  std::string text;
  for (auto const& [fd, name] : names) text += std::to_string(fd) + " " + name + "\n";
  return text;
}

TEST_F(SpawnProcessTest, ChildInheritsTheCallersDescriptorsAndNotItsPipe) {
  TTempDir const dir;
  WriteFile(dir.Path("inherited"), "");
  WriteFile(dir.Path("closed"), "");
  int const inherited = ::open(dir.Path("inherited").c_str(), O_RDONLY);
  int const closed = ::open(dir.Path("closed").c_str(), O_RDONLY | O_CLOEXEC);
  std::string const expected = InheritableDescriptors();
  std::string const descriptors = RunChild("PrintsDescriptors").fOutput;
  ::close(inherited);
  ::close(closed);
  EXPECT_EQ(descriptors, expected);
  EXPECT_NE(descriptors.find(std::to_string(inherited) + " " + dir.Path("inherited") + "\n"), std::string::npos) << descriptors;
}

TEST_F(SpawnProcessTest, PipeOfAnotherThreadIsNotInherited) {
  std::string const before = InheritableDescriptors();
  TTypedInput input;
  int const count = OpenDescriptors();
  std::thread other([] { RunChild("EchoesItsInput"); });
  while (OpenDescriptors() != count + 1) std::this_thread::sleep_for(5ms);  // the read end of its pipe
  std::string const during = InheritableDescriptors(), descriptors = RunChild("PrintsDescriptors").fOutput;
  input.End();
  other.join();
  EXPECT_EQ(during, before);
  EXPECT_EQ(descriptors, before);
}

// Some children wait for the end of their input; others, started meanwhile, end immediately. If a waiting child held the pipe of
// another one, that one would time out.
TEST_F(SpawnProcessTest, NoChildWaitsForThatOfAnotherThread) {
  constexpr int kWaiting = 100, kTimeoutSeconds = 40;
  TTypedInput input;
  std::atomic<int> started{0}, wrong{0}, rounds{0};
  std::vector<std::thread> waiting;
  std::thread quick([&] {
    while (started < kWaiting || rounds < kWaiting) {
      if (RunChild("PrintsNothing", {}, kTimeoutSeconds).fResult != 0) ++wrong;
      ++rounds;
      if (wrong > 0) return;
    }
  });
  for (int i = 0; i < kWaiting; ++i) {
    waiting.emplace_back([&wrong] {
      if (RunChild("EchoesItsInput").fResult != 0) ++wrong;
    });
    ++started;
    std::this_thread::sleep_for(1ms);
  }
  quick.join();
  input.End();
  for (std::thread& thread : waiting) thread.join();
  EXPECT_EQ(wrong, 0) << "after " << rounds << " children that end at once";
  while (::waitpid(-1, nullptr, 0) > 0) {
  }  // what timed out
}

TEST_F(SpawnProcessTest, OutputIsCapturedEvenWhenTheStandardDescriptorsAreClosed) {
  for (std::vector<int> const& closed : std::vector<std::vector<int>>{{0}, {1}, {2}, {0, 1}, {1, 2}, {0, 1, 2}}) {
    SCOPED_TRACE(testing::PrintToString(closed));
    EXPECT_EQ(InChild([&] {
                for (int const fd : closed) ::close(fd);
                TRun const run = RunChild("PrintsToBoth");
                return std::to_string(run.fResult) + " " + run.fOutput;
              }),
              "0 out1 err1 out2 err2");
  }
}

TEST_F(SpawnProcessTest, AReadEndThatSelectCannotWatchIsAFailureOfSelectAndNothingIsRun) {
  TTempDir const dir;
  rlimit limit;
  ASSERT_EQ(::getrlimit(RLIMIT_NOFILE, &limit), 0);
  NEEDS(limit.rlim_max >= 2048, "leave to open 2048 files");
  rlimit const more{2048, limit.rlim_max};
  ASSERT_EQ(::setrlimit(RLIMIT_NOFILE, &more), 0);
  std::vector<int> open{::open("/dev/null", O_RDONLY)};
  std::string output;
  TEntries const entries = LogOf([&] {
    while (open.back() < FD_SETSIZE - 1) open.push_back(::open("/dev/null", O_RDONLY));  // the log has its file by now
    EXPECT_EQ(TOSSpecific::SpawnProcess(Child("WritesAFile"), {dir.Path("run"), "x"}, output, kForEver), -1);
  });
  // Now 1023 for the read end, which select can watch, and 1024 for the write end.
  ::close(open.back());
  open.pop_back();
  TRun const last = RunChild("PrintsToBoth");
  for (int const fd : open) ::close(fd);
  ::setrlimit(RLIMIT_NOFILE, &limit);
  EXPECT_EQ(entries, (TEntries{"[Debug] SpawnProcess: process " + Child("WritesAFile"),
                               "[Debug] ERROR: SpawnProcess - select call failed!"}));
  EXPECT_EQ(output, "");
  EXPECT_FALSE(std::filesystem::exists(dir.Path("run")));
  EXPECT_EQ(last.fResult, 0);
  EXPECT_EQ(last.fOutput, "out1 err1 out2 err2");
}

TEST_F(SpawnProcessTest, WithoutDescriptorsForAPipeItIsMinusOneAndLogged) {
  if (kIsSanitized) GTEST_SKIP() << "a sanitizer needs additional descriptors";
  TEntries const entries = LogOf([] {
    int const lowest = ::dup(0);
    ::close(lowest);
    rlimit limit;
    ::getrlimit(RLIMIT_NOFILE, &limit);
    rlimit const none{static_cast<rlim_t>(lowest), limit.rlim_max};
    ::setrlimit(RLIMIT_NOFILE, &none);
    std::string output;
    int const result = TOSSpecific::SpawnProcess(Child("PrintsToBoth"), {}, output, kForEver);
    ::setrlimit(RLIMIT_NOFILE, &limit);
    EXPECT_EQ(result, -1);
    EXPECT_EQ(output, "");
  });
  EXPECT_EQ(entries, (TEntries{"[Debug] SpawnProcess: process " + Child("PrintsToBoth"),
                               "[Debug] ERROR: SpawnProcess - pipe call failed!"}));
}

TEST_F(SpawnProcessTest, LeavesNoDescriptorOpen) {
  int const before = OpenDescriptors();
  RunChild("PrintsToBoth");
  RunChild("DiesBySignal", {"9"});
  TOSSpecific::SpawnProcess("/nonexistent", kForEver);
  EXPECT_EQ(OpenDescriptors(), before);
  std::string output;
  TOSSpecific::SpawnProcess(Child("StaysSilent"), {}, output, 3);
  EXPECT_EQ(OpenDescriptors(), before);
  EndChild(output);
}

// ---- The start of the child ----

TEST_F(SpawnProcessTest, WhereNoProcessCanBeMadeItThrows) {
  // Runs in a child, as a user who may create no further process.
  auto const spawnWithoutProcesses = [](auto spawn) {
    return InChild([&] {
      TLogger::GetInstance()->ClearLog();
      rlimit const none{0, 0};
      if (!BecomeUnprivileged() || ::setrlimit(RLIMIT_NPROC, &none) != 0) return std::string("not prepared");
      int const before = OpenDescriptors();
      std::string result;
      try {
        result = spawn();
      } catch (TZEPException const& thrown) {
        result = thrown.what();
      }
      for (auto const& entry : TLogger::GetInstance()->GetLog())
        result += " " + std::to_string(entry.fSeverity) + ":" + entry.fMessage;
      if (OpenDescriptors() != before) result += " and descriptors left";
      return result;
    });
  };
  std::string const failure = "kZEPStatusFail 0:ERROR: Fork failed";
  std::string output;
  EXPECT_EQ(spawnWithoutProcesses([&] { return std::to_string(TOSSpecific::SpawnProcess("true", {}, output, kForEver)); }),
            failure);
  EXPECT_EQ(
      spawnWithoutProcesses([&] { return std::to_string(TOSSpecific::SpawnProcess("/bin/true", {}, "", {}, output, kForEver)); }),
      failure);
  EXPECT_EQ(spawnWithoutProcesses([&] { return TOSSpecific::SpawnProcess("true", TArguments{}, kForEver); }), failure);
  EXPECT_EQ(spawnWithoutProcesses([&] { return TOSSpecific::SpawnProcess("true", kForEver); }), failure);
}

// After a fork, each page of the caller costs a fault at its next write; and the time of the fork grows with their number.
TEST_F(SpawnProcessTest, TheCallersMemoryIsNotCopied) {
  if (kIsSanitized) GTEST_SKIP() << "not with a sanitizer, which may fork instead";
  constexpr std::size_t kPages = 20000, kPageSize = 4096;
  void* const memory = ::mmap(nullptr, kPages * kPageSize, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
  ASSERT_NE(memory, MAP_FAILED);
  ::madvise(memory, kPages * kPageSize, MADV_NOHUGEPAGE);
  auto const touch = [&] {
    for (std::size_t page = 0; page < kPages; ++page) static_cast<char volatile*>(memory)[page * kPageSize] = 1;
  };
  auto const faults = [] {
    rusage usage;
    ::getrusage(RUSAGE_SELF, &usage);
    return usage.ru_minflt;
  };
  touch();
  RunChild("PrintsNothing");
  long const before = faults();
  touch();
  long const after = faults();
  ::munmap(memory, kPages * kPageSize);
  EXPECT_LT(after - before, static_cast<long>(kPages / 10));
}

bool gForkHandlerRan = false;

TEST_F(SpawnProcessTest, HandlersOfPthreadAtforkAreNotRun) {
  if (kIsSanitized) GTEST_SKIP() << "not with a sanitizer, which may fork instead";
  EXPECT_EQ(InChild([] {
              ::pthread_atfork([] { gForkHandlerRan = true; }, nullptr, nullptr);
              RunChild("PrintsNothing");
              return gForkHandlerRan ? "run" : "not run";
            }),
            "not run");
}

int gExitStatus = -1;

TEST_F(SpawnProcessTest, AFailedExecExitsWith255) {
  EXPECT_EQ(InChild([] {
              struct sigaction action = {};
              action.sa_sigaction = [](int, siginfo_t* info, void*) { gExitStatus = info->si_status; };
              action.sa_flags = SA_SIGINFO | SA_RESTART;
              ::sigaction(SIGCHLD, &action, nullptr);
              std::string output;
              TOSSpecific::SpawnProcess("/nonexistent", {}, output, -1);
              return std::to_string(gExitStatus);
            }),
            "255");
}

// Calls the function on a thread with a stack of that size.
void OnStackOf(std::size_t size, std::function<void()> function) {
  pthread_attr_t attributes;
  ::pthread_attr_init(&attributes);
  EXPECT_EQ(::pthread_attr_setstacksize(&attributes, size), 0);
  pthread_t thread;
  auto const call = [](void* argument) -> void* {
    (*static_cast<std::function<void()>*>(argument))();
    return nullptr;
  };
  ASSERT_EQ(::pthread_create(&thread, &attributes, call, &function), 0);
  ::pthread_attr_destroy(&attributes);
  ::pthread_join(thread, nullptr);
}

TEST_F(SpawnProcessTest, AStackOf32KiBIsEnough) {
  if (kIsSanitized) GTEST_SKIP() << "a sanitizer needs additional stack";
  constexpr std::size_t kLength = 1000000;
  TTempDir const dir;
  TRun searched, withEnvironment;
  OnStackOf(32 * 1024, [&] {
    TLogger::GetInstance()->SetLogFilename(dir.Path("log"));
    searched = RunChild("PrintsALot", {std::to_string(kLength)});
    withEnvironment.fResult = TOSSpecific::SpawnProcess(Child("PrintsALot"), {std::to_string(kLength)}, "zero", {"A=1"},
                                                        withEnvironment.fOutput, kForEver);
  });
  EXPECT_EQ(searched.fResult, 0);
  EXPECT_EQ(searched.fOutput.size(), kLength);
  EXPECT_EQ(withEnvironment.fResult, 0);
  EXPECT_TRUE(withEnvironment.fOutput == searched.fOutput);
}

TEST_F(SpawnProcessTest, WorksInManyThreads) {
  std::atomic<int> wrong{0};
  std::vector<std::thread> threads;
  for (int i = 0; i < 8; ++i)
    threads.emplace_back([&wrong, i] {
      for (int round = 0; round < 25; ++round) {
        TRun const run = RunChild("PrintsArguments", {std::to_string(i), std::to_string(round)});
        std::string const expected =
            "[" + Child("PrintsArguments") + "][" + std::to_string(i) + "][" + std::to_string(round) + "]";
        if (run.fResult != 0 || run.fOutput != expected) ++wrong;
      }
    });
  for (std::thread& thread : threads) thread.join();
  EXPECT_EQ(wrong, 0);
}

// ---- A thousand times ----

class SpawnAThousandTimesTest : public testing::TestWithParam<char const*> {};

TEST_P(SpawnAThousandTimesTest, LeaksNothing) {
  TProgramRun const run = RunProgram(BuildPath("tests/programs/SpawnsAThousandTimes") + " " + GetParam());
  EXPECT_EQ(run.fExitCode, 0);  // also without a report of a leak sanitizer
  EXPECT_EQ(run.fOutput, "0 descriptors, no children, 0 bytes\n");
}

INSTANTIATE_TEST_SUITE_P(Forms, SpawnAThousandTimesTest,
                         testing::Values("PathAndEnvironment", "SearchedProgram", "StringOfAProgram", "CommandLine",
                                         "NoSuchProgram", "ProgramThatFails", "ProgramThatDies", "TimedOut", "CapFileViaProc",
                                         "FindFile"),
                         [](auto const& form) { return form.param; });

}  // namespace
}  // namespace NQRVZEP20
