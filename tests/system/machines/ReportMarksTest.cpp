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
#include <optional>
#include <string>

namespace NQRVZEP20::zep {
namespace {

// Of zep and the processes of its plug-ins.
struct TUse {
  double fCpuMilliseconds;  // the sum over all of them
  double fMebibytes;        // the resident memory of the largest
};

double MillisecondsOf(timeval const& time) { return time.tv_sec * 1e3 + time.tv_usec / 1e3; }

// Of a report on the machine of this root directory; empty if it failed.
std::optional<TUse> UseOfReport(char const* form, std::string const& root) {
  pid_t const child = ::fork();
  if (child == 0) {
    ::setenv("ZEP_ROOT", root.c_str(), 1);
    int const nothing = ::open("/dev/null", O_WRONLY);
    ::dup2(nothing, STDOUT_FILENO);
    ::dup2(nothing, STDERR_FILENO);
    ::execl(TEST_BIN_DIR "/zep", "zep", "report", form, nullptr);
    ::_exit(127);
  }
  int status = 0;
  rusage use{};
  constexpr int incomplete = 2;  // a machine without a serial number
  if (::wait4(child, &status, 0, &use) != child || !WIFEXITED(status) || WEXITSTATUS(status) > incomplete) return std::nullopt;
  return TUse{MillisecondsOf(use.ru_utime) + MillisecondsOf(use.ru_stime), use.ru_maxrss / 1024.0};
}

class ReportMarksTest : public testing::TestWithParam<char const*> {};

// 120 ms and 50 MB. Processor time is measured, because other programs may use the machine at the same time. The resident memory
// includes the parts of files that the kernel keeps anyway; compare_machine measures the memory of all processes together.
TEST_P(ReportMarksTest, AReportIsQuickAndSmall) {
  TRecordedMachine const machine("server");
  constexpr int attempts = 5;
  double milliseconds = 1e9, mebibytes = 0;
  for (int attempt = 0; attempt < attempts; ++attempt) {
    auto const use = UseOfReport(GetParam(), machine.Root());
    ASSERT_TRUE(use);
    milliseconds = std::min(milliseconds, use->fCpuMilliseconds);
    mebibytes = std::max(mebibytes, use->fMebibytes);
  }
  RecordProperty("cpu_milliseconds", std::to_string(milliseconds));
  EXPECT_GT(milliseconds, 1);
  EXPECT_LE(milliseconds, 120);
  EXPECT_LE(mebibytes, 50 * 1e6 / (1 << 20));
}

INSTANTIATE_TEST_SUITE_P(Forms, ReportMarksTest, testing::Values("--full", "--json"),
                         [](auto const& form) { return form.index == 0 ? "Full" : "Json"; });

}  // namespace
}  // namespace NQRVZEP20::zep
