// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/processes/TChildProcess.h"

#include "tests/Support.h"

#include <grp.h>
#include <sys/prctl.h>
#include <sys/resource.h>
#include <sys/time.h>
#include <sys/wait.h>

#include <atomic>
#include <csignal>
#include <system_error>

namespace NQRVZEP20::zep {
namespace {

std::string AllOf(TChildProcess& child) {
  std::string text;
  while (child.Read(text)) continue;
  return text;
}

std::size_t OpenDescriptors() {
  auto const entries = std::filesystem::directory_iterator("/proc/self/fd");
  return static_cast<std::size_t>(std::distance(begin(entries), end(entries)));
}

bool IsAnyChildLeft() { return ::waitpid(-1, nullptr, WNOHANG) != -1; }

TEST(TChildProcessTest, SendsTheResultOfItsWork) {
  std::size_t const before = OpenDescriptors();
  TChildProcess child([] { return std::string(1000000, 'x') + std::to_string(::getpid()); }, SIGKILL);
  std::string const id = std::to_string(child.Id());
  EXPECT_NE(id, std::to_string(::getpid()));
  EXPECT_EQ(AllOf(child), std::string(1000000, 'x') + id);
  EXPECT_TRUE(child.End());
  EXPECT_EQ(child.Id(), -1);
  EXPECT_EQ(OpenDescriptors(), before);
  EXPECT_FALSE(IsAnyChildLeft());
}

TEST(TChildProcessTest, WorkThatDoesNotFinishIsIncomplete) {
  std::function<std::string()> const works[] = {
      []() -> std::string { throw std::runtime_error("no"); },
      []() -> std::string { throw 1; },
      []() -> std::string { ::_exit(3); },
      [] {
        ::raise(SIGKILL);
        return std::string("never sent");
      },
  };
  for (auto const& work : works) {
    TChildProcess child(work, SIGKILL);
    EXPECT_EQ(AllOf(child), "");
    EXPECT_FALSE(child.End());
  }
}

TEST(TChildProcessTest, ARunningChildIsKilledWithItsOwner) {
  auto const Forever = [] {
    ::pause();
    return std::string();
  };
  std::size_t const before = OpenDescriptors();
  {
    TChildProcess const child(Forever, SIGTERM);
    TChildProcess killed(Forever, SIGTERM);
    killed.Kill();
    EXPECT_EQ(killed.Id(), -1);
    TChildProcess source(Forever, SIGTERM);
    killed = std::move(source);
    TChildProcess const moved(std::move(killed));
    EXPECT_GT(moved.Id(), 0);
  }
  EXPECT_FALSE(IsAnyChildLeft());
  EXPECT_EQ(OpenDescriptors(), before);
}

TEST(TChildProcessTest, TheChildGetsTheSignalOfAnOrphan) {
  for (int const signal : {SIGTERM, SIGKILL}) {
    TChildProcess child(
        [] {
          int signalAtDeath = 0;
          ::prctl(PR_GET_PDEATHSIG, &signalAtDeath);
          return std::to_string(signalAtDeath);
        },
        signal);
    EXPECT_EQ(AllOf(child), std::to_string(signal));
  }
}

// Signals arrive while one child is read from and while another is waited for.
TEST(TChildProcessTest, SignalsDoNotDisturbReadingAndWaiting) {
  static std::atomic<int> signals;
  struct sigaction action {
  }, before;
  action.sa_handler = [](int) { ++signals; };
  ::sigaction(SIGALRM, &action, &before);
  itimerval const often{{0, 20000}, {0, 20000}}, never{};
  ::setitimer(ITIMER_REAL, &often, nullptr);
  auto const After = [](unsigned milliseconds) {
    return [milliseconds] {
      ::usleep(milliseconds * 1000);
      return std::string("late");
    };
  };
  TChildProcess read(After(200), SIGKILL), waitedFor(After(400), SIGKILL);
  std::string const text = AllOf(read);
  bool const isReadComplete = read.End(), isOtherComplete = waitedFor.End();
  ::setitimer(ITIMER_REAL, &never, nullptr);
  ::sigaction(SIGALRM, &before, nullptr);
  EXPECT_GT(signals, 1);
  EXPECT_EQ(text, "late");
  EXPECT_TRUE(isReadComplete);
  EXPECT_TRUE(isOtherComplete);
  EXPECT_FALSE(IsAnyChildLeft());
}

// For use in a child: makes the constructor fail, as a user without privileges who may create no further process. Exits with 0
// when the constructor throws and leaves no descriptor open.
[[noreturn]] void ExceedTheProcessLimit() {
  constexpr unsigned kNobody = 65534;
  if (::geteuid() == 0 && (::setgroups(0, nullptr) != 0 || ::setgid(kNobody) != 0 || ::setuid(kNobody) != 0)) ::_exit(1);
  rlimit const none{0, 0};
  if (::setrlimit(RLIMIT_NPROC, &none) != 0) ::_exit(2);
  int const next = ::dup(STDIN_FILENO);
  ::close(next);
  try {
    TChildProcess const child([] { return ""; }, SIGKILL);
  } catch (std::system_error const& failure) {
    int const nextThen = ::dup(STDIN_FILENO);
    ::_exit(failure.code().value() != EAGAIN ? 3 : nextThen != next ? 4 : 0);
  }
  ::_exit(5);
}

TEST(TChildProcessTest, WhenNoProcessCanBeCreatedNoDescriptorIsLeftOpen) {
  pid_t const child = ::fork();
  if (child == 0) ExceedTheProcessLimit();
  int status = -1;
  ::waitpid(child, &status, 0);
  EXPECT_TRUE(WIFEXITED(status));
  EXPECT_EQ(WEXITSTATUS(status), 0);
}

}  // namespace
}  // namespace NQRVZEP20::zep
