// SPDX-License-Identifier: Apache-2.0

// Tests running work in child processes.

#include "tools/zep/processes/Processes.h"

#include "tests/Support.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <chrono>
#include <csignal>
#include <map>
#include <stdexcept>
#include <thread>

namespace NQRVZEP20::zep {
namespace {

using TClock = std::chrono::steady_clock;

double SecondsSince(TClock::time_point start) { return std::chrono::duration<double>(TClock::now() - start).count(); }

std::map<std::size_t, TProcessResult> ResultsOf(std::size_t count, TProcessLimits const& limits,
                                                std::function<std::string(std::size_t)> const& work) {
  std::map<std::size_t, TProcessResult> results;
  auto const sendAll = [&](std::size_t item, TSend const& send) { send(work(item)); };
  RunInProcesses(count, limits, sendAll, [&](TProcessResult const& result) {
    EXPECT_TRUE(results.emplace(result.fItem, result).second) << "a second result for item " << result.fItem;
  });
  EXPECT_EQ(::waitpid(-1, nullptr, WNOHANG), -1) << "every process should have been waited for";
  EXPECT_EQ(errno, ECHILD);
  return results;
}

void Sleep(int milliseconds) { std::this_thread::sleep_for(std::chrono::milliseconds(milliseconds)); }

TEST(ProcessesTest, EachItemHasItsResult) {
  auto const results = ResultsOf(100, {7, 60}, [](std::size_t item) { return "item " + std::to_string(item); });
  ASSERT_EQ(results.size(), 100u);
  for (auto const& [item, result] : results) {
    EXPECT_EQ(result.fOutput, "item " + std::to_string(item));
    EXPECT_TRUE(result.fIsComplete);
    EXPECT_FALSE(result.fIsTimeUp);
  }
}

TEST(ProcessesTest, WithoutItemsNothingRuns) {
  EXPECT_TRUE(ResultsOf(0, {4, 60}, [](std::size_t) { return ""; }).empty());
}

TEST(ProcessesTest, EachItemRunsInItsOwnProcess) {
  auto const results = ResultsOf(3, {1, 60}, [](std::size_t) { return std::to_string(::getpid()); });
  EXPECT_NE(results.at(0).fOutput, results.at(1).fOutput);
  EXPECT_NE(results.at(0).fOutput, std::to_string(::getpid()));
}

TEST(ProcessesTest, AFailureDoesNotStopTheOthers) {
  auto const results = ResultsOf(5, {2, 60}, [](std::size_t item) -> std::string {
    if (item == 1) throw std::runtime_error("no");
    if (item == 2) ::raise(SIGKILL);
    if (item == 3) ::_exit(0);
    return "done";
  });
  ASSERT_EQ(results.size(), 5u);
  EXPECT_TRUE(results.at(0).fIsComplete);
  EXPECT_FALSE(results.at(1).fIsComplete);
  EXPECT_FALSE(results.at(2).fIsComplete);
  EXPECT_EQ(results.at(3).fOutput, "");
  EXPECT_EQ(results.at(4).fOutput, "done");
}

// Limits the process to `count` more descriptors until it is destroyed.
class TDescriptorsLeft {
public:
  explicit TDescriptorsLeft(rlim_t count) {
    int const next = ::dup(STDIN_FILENO);
    ::close(next);
    ::getrlimit(RLIMIT_NOFILE, &fBefore);
    rlimit const few{static_cast<rlim_t>(next) + count, fBefore.rlim_max};
    ::setrlimit(RLIMIT_NOFILE, &few);
  }
  ~TDescriptorsLeft() { ::setrlimit(RLIMIT_NOFILE, &fBefore); }
  TDescriptorsLeft(TDescriptorsLeft const&) = delete;
  TDescriptorsLeft& operator=(TDescriptorsLeft const&) = delete;

private:
  rlimit fBefore{};
};

TEST(ProcessesTest, WhenNoFurtherProcessCanBeCreatedItWaitsForOneToEnd) {
  if (kIsSanitized) GTEST_SKIP() << "a sanitizer needs additional descriptors";
  TDescriptorsLeft const left(4);
  auto const results = ResultsOf(10, {10, 60}, [](std::size_t item) { return "item " + std::to_string(item); });
  ASSERT_EQ(results.size(), 10u);
  for (auto const& [item, result] : results) EXPECT_EQ(result.fOutput, "item " + std::to_string(item));
}

TEST(ProcessesTest, WhenNoProcessCanBeCreatedEveryItemIsIncomplete) {
  if (kIsSanitized) GTEST_SKIP() << "a sanitizer needs additional descriptors";
  TDescriptorsLeft const left(1);
  auto const results = ResultsOf(10, {10, 60}, [](std::size_t) { return "done"; });
  ASSERT_EQ(results.size(), 10u);
  for (auto const& [item, result] : results) EXPECT_FALSE(result.fIsComplete) << item;
}

TEST(ProcessesTest, AProcessIsKilledAtItsTimeLimit) {
  auto const start = TClock::now();
  auto const results = ResultsOf(3, {3, 1}, [](std::size_t item) {
    if (item == 1) Sleep(30000);
    return std::string("done");
  });
  EXPECT_LT(SecondsSince(start), 10);
  EXPECT_TRUE(results.at(1).fIsTimeUp);
  EXPECT_FALSE(results.at(1).fIsComplete);
  EXPECT_TRUE(results.at(0).fIsComplete);
  EXPECT_TRUE(results.at(2).fIsComplete);
}

TEST(ProcessesTest, NoMoreProcessesRunAtOnceThanAllowed) {
  auto const start = TClock::now();
  ResultsOf(6, {2, 60}, [](std::size_t) {
    Sleep(200);
    return std::string();
  });
  EXPECT_GE(SecondsSince(start), 0.6);
}

TEST(ProcessesTest, EachResultIsPassedOnAsSoonAsItIsComplete) {
  std::vector<std::size_t> order;
  RunInProcesses(
      3, {3, 60}, [](std::size_t item, TSend const&) { Sleep(item == 0 ? 1000 : 0); },
      [&](TProcessResult const& result) { order.push_back(result.fItem); });
  ASSERT_EQ(order.size(), 3u);
  EXPECT_EQ(order.back(), 0u);
}

TEST(ProcessesTest, TextSentBeforeTheTimeLimitIsInTheResult) {
  RunInProcesses(
      1, {1, 1},
      [](std::size_t, TSend const& send) {
        send("first ");
        send("second");
        Sleep(30000);
        send(" third");
      },
      [&](TProcessResult const& result) {
        EXPECT_TRUE(result.fIsTimeUp);
        EXPECT_FALSE(result.fIsComplete);
        EXPECT_EQ(result.fOutput, "first second");
      });
}

TEST(ProcessesTest, ALongOutputIsComplete) {
  auto const results = ResultsOf(2, {2, 60}, [](std::size_t) { return std::string(1000000, 'x'); });
  EXPECT_EQ(results.at(0).fOutput.size(), 1000000u);
  EXPECT_EQ(results.at(1).fOutput.size(), 1000000u);
}

TEST(ProcessesTest, AnExceptionEndsTheProcesses) {
  auto const start = TClock::now();
  EXPECT_THROW(RunInProcesses(
                   2, {2, 60},
                   [](std::size_t item, TSend const&) {
                     if (item == 1) Sleep(30000);
                   },
                   [](TProcessResult const&) { throw std::runtime_error("the disk is full"); }),
               std::runtime_error);
  EXPECT_LT(SecondsSince(start), 10);
  EXPECT_EQ(::waitpid(-1, nullptr, WNOHANG), -1);
}

}  // namespace
}  // namespace NQRVZEP20::zep
