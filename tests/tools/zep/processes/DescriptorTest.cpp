// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/processes/Descriptor.h"

#include "tests/Support.h"

#include <fcntl.h>
#include <sys/time.h>

#include <atomic>
#include <csignal>

namespace NQRVZEP20::zep {
namespace {

bool IsOpen(int fd) { return ::fcntl(fd, F_GETFD) != -1; }

TDescriptor Null() { return TDescriptor(::open("/dev/null", O_RDWR)); }

TEST(DescriptorTest, IsClosedAtTheEnd) {
  int fd = -1;
  {
    TDescriptor const descriptor = Null();
    fd = descriptor.Get();
    EXPECT_TRUE(descriptor);
    EXPECT_TRUE(IsOpen(fd));
  }
  EXPECT_FALSE(IsOpen(fd));
}

TEST(DescriptorTest, HasOneOwner) {
  TDescriptor first = Null(), second = Null();
  int const moved = first.Get(), replaced = second.Get();
  second = std::move(first);
  EXPECT_EQ(second.Get(), moved);
  EXPECT_FALSE(IsOpen(replaced));
  TDescriptor const third(std::move(second));
  EXPECT_EQ(third.Get(), moved);
  EXPECT_TRUE(IsOpen(moved));
}

TEST(DescriptorTest, BelowZeroThereIsNone) {
  EXPECT_FALSE(TDescriptor());
  EXPECT_FALSE(TDescriptor(::open("/nothing/here", O_RDONLY)));
  EXPECT_TRUE(TDescriptor(::dup(STDIN_FILENO)));
}

TEST(DescriptorTest, ClosingKeepsTheReasonOfAFailure) {
  int const taken = Null().Get();  // closed already, so that closing it again fails
  {
    TDescriptor const descriptor(taken);
    errno = ENOSPC;
  }
  EXPECT_EQ(errno, ENOSPC);
}

// The write waits in a pipe that is full, and a signal comes.
TEST(WriteWholeTest, GoesOnAfterASignal) {
  static std::atomic<int> signals;
  struct sigaction action {
  }, before;
  action.sa_handler = [](int) { ++signals; };
  ::sigaction(SIGALRM, &action, &before);
  int ends[2];
  ASSERT_EQ(::pipe(ends), 0);
  TDescriptor const readEnd(ends[0]);
  TDescriptor writeEnd(ends[1]);
  std::string const text(1000000, 'x');
  std::string got;
  std::atomic<bool> isOver = false;

  sigset_t alarm, unblocked;
  ::sigemptyset(&alarm);
  ::sigaddset(&alarm, SIGALRM);
  ::pthread_sigmask(SIG_BLOCK, &alarm, &unblocked);  // the reader is not the one to be interrupted
  std::thread reader([&] {
    while (signals < 2 && !isOver) ::usleep(1000);
    char chunk[4096];
    for (ssize_t count; (count = ::read(readEnd.Get(), chunk, sizeof chunk)) > 0;)
      got.append(chunk, static_cast<std::size_t>(count));
  });
  ::pthread_sigmask(SIG_SETMASK, &unblocked, nullptr);
  itimerval const often{{0, 20000}, {0, 20000}}, never{};
  ::setitimer(ITIMER_REAL, &often, nullptr);
  bool const isWritten = WriteWhole(writeEnd.Get(), text);
  isOver = true;
  ::setitimer(ITIMER_REAL, &never, nullptr);
  writeEnd = TDescriptor();
  reader.join();
  ::sigaction(SIGALRM, &before, nullptr);
  EXPECT_TRUE(isWritten);
  EXPECT_TRUE(got == text) << got.size();
}

TEST(WriteWholeTest, SaysWhyItCannotWrite) {
  TDescriptor const full(::open("/dev/full", O_WRONLY));
  NEEDS(full, "no /dev/full");
  EXPECT_TRUE(WriteWhole(full.Get(), ""));
  EXPECT_FALSE(WriteWhole(full.Get(), "text"));
  EXPECT_EQ(errno, ENOSPC);
}

}  // namespace
}  // namespace NQRVZEP20::zep
