// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/secrets/PrivateFile.h"

#include "tests/Support.h"
#include "tools/zep/processes/Interrupts.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <signal.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <iostream>
#include <thread>

namespace NQRVZEP20::zep {
namespace {

class PrivateFileTest : public testing::Test {
protected:
  void SetUp() override { ASSERT_EQ(::mkfifo(fPipe.c_str(), 0600), 0); }

  TTempDir fDir;
  std::string const fPipe = fDir.Path("pipe");
};

// As when the signal arrives after the last look at PendingInterrupt, and before the process waits.
TEST_F(PrivateFileTest, AnInterruptBeforeTheWaitForAPipeEndsIt) {
  constexpr unsigned kMostSeconds = 30;  // SIGALRM ends a process that waits for longer
  for (bool const hasWriter : {true, false})
    EXPECT_EXIT(
        {
          ::alarm(kMostSeconds);
          ::signal(SIGTERM, SIG_DFL);
          int const writer = hasWriter ? ::open(fPipe.c_str(), O_RDWR) : -1;
          TInterruptGuard const guard;
          ::raise(SIGTERM);
          int const error = TPrivateFile(fPipe).Error();
          ::close(writer);
          std::cerr << (error == EINTR ? "interrupted" : "read");
        },
        testing::KilledBySignal(SIGTERM), "^interrupted$");
}

TEST_F(PrivateFileTest, APipeIsReadToItsEnd) {
  std::thread writer([this] {
    std::ofstream pipe(fPipe);
    for (char const* piece : {"first ", "second ", "third"}) {
      pipe << piece << std::flush;
      ::usleep(20000);
    }
  });
  TPrivateFile const file(fPipe);
  writer.join();
  EXPECT_EQ(file.Error(), 0);
  EXPECT_EQ(file.Text(), "first second third");
}

}  // namespace
}  // namespace NQRVZEP20::zep
