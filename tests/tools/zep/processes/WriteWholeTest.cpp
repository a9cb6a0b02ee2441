// SPDX-License-Identifier: Apache-2.0
#include "core/Handles.h"
#include "tools/zep/processes/WriteWhole.h"

#include "tests/Support.h"

#include <fcntl.h>
#include <sys/time.h>

#include <atomic>
#include <csignal>

namespace NQRVZEP20::zep {
namespace {

// Signals arrive while the write waits for room in a full pipe.
TEST(WriteWholeTest, ContinuesAfterASignal) {
  static std::atomic<int> signals;
  struct sigaction action {
  }, before;
  action.sa_handler = [](int) { ++signals; };
  ::sigaction(SIGALRM, &action, &before);
  int ends[2];
  ASSERT_EQ(::pipe(ends), 0);
  TUniqueFd const readEnd(ends[0]);
  TUniqueFd writeEnd(ends[1]);
  std::string const text(1000000, 'x');
  std::string got;
  std::atomic<bool> isOver = false;

  sigset_t alarm, unblocked;
  ::sigemptyset(&alarm);
  ::sigaddset(&alarm, SIGALRM);
  ::pthread_sigmask(SIG_BLOCK, &alarm, &unblocked);  // the signals must interrupt the writer, not the reader
  std::thread reader([&] {
    while (signals < 2 && !isOver) ::usleep(1000);
    char chunk[4096];
    for (ssize_t count; (count = ::read(readEnd.get(), chunk, sizeof chunk)) > 0;)
      got.append(chunk, static_cast<std::size_t>(count));
  });
  ::pthread_sigmask(SIG_SETMASK, &unblocked, nullptr);
  itimerval const often{{0, 20000}, {0, 20000}}, never{};
  ::setitimer(ITIMER_REAL, &often, nullptr);
  bool const isWritten = WriteWhole(writeEnd.get(), text);
  isOver = true;
  ::setitimer(ITIMER_REAL, &never, nullptr);
  writeEnd = TUniqueFd();
  reader.join();
  ::sigaction(SIGALRM, &before, nullptr);
  EXPECT_TRUE(isWritten);
  EXPECT_TRUE(got == text) << got.size();
}

TEST(WriteWholeTest, LeavesTheReasonOfAFailureInErrno) {
  TUniqueFd const full(::open("/dev/full", O_WRONLY));
  NEEDS(full, "/dev/full is missing");
  EXPECT_TRUE(WriteWhole(full.get(), ""));
  EXPECT_FALSE(WriteWhole(full.get(), "text"));
  EXPECT_EQ(errno, ENOSPC);
}

}  // namespace
}  // namespace NQRVZEP20::zep
