// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/processes/Interrupts.h"

#include <gtest/gtest.h>
#include <signal.h>
#include <unistd.h>

#include <iostream>

namespace NQRVZEP20::zep {
namespace {

TEST(InterruptsTest, ASignalTakesEffectAtTheEndOfTheGuard) {
  for (int const signal : {SIGHUP, SIGINT, SIGTERM})
    EXPECT_EXIT(
        {
          ::signal(signal, SIG_DFL);
          TInterruptGuard const guard;
          ::raise(signal);
          std::cerr << (PendingInterrupt() == signal ? "pending" : "lost");
        },
        testing::KilledBySignal(signal), "^pending$");
}

TEST(InterruptsTest, TheFirstOfSeveralSignalsCounts) {
  EXPECT_EXIT(
      {
        for (int const signal : {SIGINT, SIGTERM}) ::signal(signal, SIG_DFL);
        TInterruptGuard const guard;
        ::raise(SIGINT);
        ::raise(SIGTERM);
        std::cerr << StatusOfInterrupt();
      },
      testing::KilledBySignal(SIGINT), "^130$");
}

// nohup starts programs with ignored signals, and so does a shell that starts them in the background.
TEST(InterruptsTest, AnIgnoredSignalStaysIgnored) {
  for (int const signal : {SIGHUP, SIGINT, SIGTERM})
    EXPECT_EXIT(
        {
          ::signal(signal, SIG_IGN);
          {
            TInterruptGuard const guard;
            ::raise(signal);
            std::cerr << (PendingInterrupt() == 0 ? "ignored" : "pending");
          }
          ::raise(signal);
          ::_exit(0);
        },
        testing::ExitedWithCode(0), "^ignored$");
}

}  // namespace
}  // namespace NQRVZEP20::zep
