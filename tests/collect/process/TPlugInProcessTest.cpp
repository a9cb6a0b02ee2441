// SPDX-License-Identifier: Apache-2.0
#include "collect/process/TPlugInProcess.h"

#include "tests/Support.h"

#include <sys/wait.h>
#include <unistd.h>

#include <filesystem>
#include <optional>

namespace NQRVZEP20 {
namespace {

TEST(TPlugInProcessTest, ACopyOfTheHandleInAForkedProcessDoesNotKill) {
  TTempDir const dir;
  std::string const file = dir.Path("libDawdles.nsp.so");
  std::filesystem::copy(MISBEHAVES, file);
  std::optional<TPlugInProcess> process;
  process.emplace("Dawdles", file, TApartLimits(), "", false);
  pid_t const copy = ::fork();
  if (copy == 0) {
    process.reset();
    ::_exit(0);
  }
  ::waitpid(copy, nullptr, 0);
  siginfo_t ended{};
  ::waitid(P_PID, static_cast<id_t>(process->Supervisor()), &ended, WEXITED | WNOHANG | WNOWAIT);
  EXPECT_EQ(ended.si_pid, 0) << "the supervisor has ended";
  while (!process->HasEnded()) {
    ::usleep(1000);
    process->Follow();
  }
  EXPECT_EQ(process->Result().fError, "");
  ASSERT_EQ(process->Result().fProviders.size(), 1u);
  EXPECT_EQ(process->Result().fProviders[0].fError, "");
}

}  // namespace
}  // namespace NQRVZEP20
