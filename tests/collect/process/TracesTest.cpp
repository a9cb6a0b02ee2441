// SPDX-License-Identifier: Apache-2.0
#include "collect/process/Traces.h"

#include "core/Handles.h"
#include "tests/Support.h"

#include <fcntl.h>
#include <gmock/gmock.h>
#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

namespace NQRVZEP20 {
namespace {

using testing::Contains;
using testing::Each;
using testing::Not;
using testing::StartsWith;
using TTexts = std::vector<std::string>;

// A child of this process that does nothing, until it is killed.
class TIdleChild {
public:
  TIdleChild() : fId(::fork()) {
    if (fId != 0) return;
    for (;;) ::pause();
  }
  ~TIdleChild() {
    Kill();
    ::waitpid(fId, nullptr, 0);
  }
  void Kill() const { ::kill(fId, SIGKILL); }
  std::string Id() const { return std::to_string(fId); }

private:
  pid_t const fId;
};

TEST(TracesTest, ADescriptorIsATraceWhenItIsNewOrHasAnotherTarget) {
  TUniqueFd const kept(::open("/dev/null", O_RDONLY));
  TUniqueFd const replaced(::open("/dev/null", O_RDONLY));
  auto const before = OpenDescriptors();
  EXPECT_EQ(before.at(kept.get()), "/dev/null");
  EXPECT_EQ(TracesSince(before).fDescriptors, TTexts{});

  TUniqueFd const added(::open("/dev/zero", O_RDONLY));
  ::dup2(added.get(), replaced.get());
  EXPECT_EQ(TracesSince(before).fDescriptors,
            (TTexts{std::to_string(replaced.get()) + " (/dev/zero)", std::to_string(added.get()) + " (/dev/zero)"}));
}

TEST(TracesTest, ThereIsALimitForTheDescriptors) {
  std::vector<TUniqueFd> open;
  auto const before = OpenDescriptors();
  for (int n = 0; n < 200; ++n) open.emplace_back(::open("/dev/null", O_RDONLY));
  EXPECT_EQ(TracesSince(before).fDescriptors.size(), 100u);
}

// The parent of this process, ctest, may have other children.
TEST(TracesTest, AChildIsATraceUntilItHasBeenWaitedFor) {
  auto const processes = [open = OpenDescriptors()] { return TracesSince(open).fProcesses; };
  std::string running;
  {
    TIdleChild const child;
    running = child.Id() + " (collect_tests)";
    EXPECT_THAT(processes(), Contains(running));
    child.Kill();
    siginfo_t info{};
    ::waitid(P_ALL, 0, &info, WEXITED | WNOWAIT);
    EXPECT_THAT(processes(), Contains(running + ", which has ended and was not waited for"));
  }
  EXPECT_THAT(processes(), Each(Not(StartsWith(running))));
}

}  // namespace
}  // namespace NQRVZEP20
