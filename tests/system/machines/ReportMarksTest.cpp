// SPDX-License-Identifier: Apache-2.0

// The time and the memory that zep report may need, with all providers, on the recorded server.

#include "tests/Machines.h"

#include <gtest/gtest.h>

#include <fcntl.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <optional>
#include <stdexcept>
#include <string>
#include <vector>

namespace NQRVZEP20::zep {
namespace {

// Of zep and the processes of its plug-ins.
struct TUse {
  double fCpuMilliseconds;  // the sum over all of them
  double fMebibytes;        // the resident memory of the largest
};

double MillisecondsOf(timeval const& time) { return time.tv_sec * 1e3 + time.tv_usec / 1e3; }

// Of zep with these arguments, on the machine of this root directory, whose output goes to a file; empty if it failed.
std::optional<TUse> UseOf(std::vector<std::string> arguments, std::string const& root, std::string const& output = "/dev/null") {
  std::vector<char*> pointers;
  arguments.insert(arguments.begin(), "zep");
  for (std::string& argument : arguments) pointers.push_back(argument.data());
  pointers.push_back(nullptr);
  pid_t const child = ::fork();
  if (child == 0) {
    ::setenv("ZEP_ROOT", root.c_str(), 1);
    ::dup2(::open(output.c_str(), O_WRONLY | O_CREAT, 0600), STDOUT_FILENO);
    ::dup2(::open("/dev/null", O_WRONLY), STDERR_FILENO);
    ::execv(TEST_BIN_DIR "/zep", pointers.data());
    ::_exit(127);
  }
  int status = 0;
  rusage use{};
  constexpr int incomplete = 2;  // a machine without a serial number
  if (::wait4(child, &status, 0, &use) != child || !WIFEXITED(status) || WEXITSTATUS(status) > incomplete) return std::nullopt;
  return TUse{MillisecondsOf(use.ru_utime) + MillisecondsOf(use.ru_stime), use.ru_maxrss / 1024.0};
}

// The least time and the most memory of several runs. Processor time is measured, because other programs may use the machine at
// the same time.
TUse LeastUseOf(std::vector<std::string> const& arguments, std::string const& root) {
  constexpr int attempts = 5;
  TUse least{1e9, 0};
  for (int attempt = 0; attempt < attempts; ++attempt) {
    auto const use = UseOf(arguments, root);
    if (!use) throw std::runtime_error(arguments.front() + " failed");
    least = {std::min(least.fCpuMilliseconds, use->fCpuMilliseconds), std::max(least.fMebibytes, use->fMebibytes)};
  }
  testing::Test::RecordProperty("cpu_milliseconds", std::to_string(least.fCpuMilliseconds));
  EXPECT_GT(least.fCpuMilliseconds, 1);
  return least;
}

class ReportMarksTest : public testing::TestWithParam<char const*> {};

// 120 ms and 50 MB. The resident memory includes the parts of files that the kernel keeps anyway; compare_machine measures the
// memory of all processes together.
TEST_P(ReportMarksTest, AReportIsQuickAndSmall) {
  TRecordedMachine const machine("server");
  TUse const use = LeastUseOf({"report", GetParam()}, machine.Root());
  EXPECT_LE(use.fCpuMilliseconds, 120);
  EXPECT_LE(use.fMebibytes, 50 * 1e6 / (1 << 20));
}

INSTANTIATE_TEST_SUITE_P(Forms, ReportMarksTest, testing::Values("--full", "--json"),
                         [](auto const& form) { return form.index == 0 ? "Full" : "Json"; });

// The page of a full report: 300 KB and 100 ms.
TEST(StoredReportMarksTest, APageIsSmallAndQuick) {
  TRecordedMachine const machine("server");
  TTempDir const dir;
  std::string const report = dir.Path("a.json"), page = dir.Path("a.html");
  ASSERT_TRUE(UseOf({"report", "--json"}, machine.Root(), report));
  EXPECT_GT(std::filesystem::file_size(report), 1000000u);
  EXPECT_LE(LeastUseOf({"report", "--from", report, "--html", page}, machine.Root()).fCpuMilliseconds, 100);
  EXPECT_LE(std::filesystem::file_size(page), 300000u);
}

// The comparison of two full reports: 50 ms.
TEST(StoredReportMarksTest, AComparisonIsQuick) {
  TTempDir const dir;
  for (char const* const name : {"server", "degraded"}) {
    TRecordedMachine const machine(name);
    std::string const before = dir.Path("a.json"), after = dir.Path("b.json");
    for (std::string const& report : {before, after}) ASSERT_TRUE(UseOf({"report", "--json"}, machine.Root(), report));
    EXPECT_LE(LeastUseOf({"diff", before, after}, machine.Root()).fCpuMilliseconds, 50) << name;
  }
}

}  // namespace
}  // namespace NQRVZEP20::zep
