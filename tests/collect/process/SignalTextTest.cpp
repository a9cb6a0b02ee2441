// SPDX-License-Identifier: Apache-2.0
#include "collect/process/SignalText.h"

#include <gtest/gtest.h>

#include <csignal>

namespace NQRVZEP20 {
namespace {

TEST(SignalTextTest, ASignalHasItsNameAndDescription) {
  EXPECT_EQ(SignalText(SIGSEGV), "SIGSEGV (Segmentation fault)");
  EXPECT_EQ(SignalText(SIGKILL), "SIGKILL (Killed)");
  EXPECT_EQ(SignalText(1000), "signal 1000");
  EXPECT_EQ(SignalName(SIGSEGV), "SIGSEGV");
  EXPECT_EQ(SignalName(1000), "signal 1000");
}

}  // namespace
}  // namespace NQRVZEP20
