// SPDX-License-Identifier: Apache-2.0
#include "providers/host/CpuInfo.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

TEST(CpuInfoTest, CpusAreSeparated) {
  std::string const text =
      "processor\t: 0\nmodel name\t: Example P2400 @ 2.40GHz\nflags\t\t: fpu  lm\npower management:\n\n"
      "processor\t: 2\nmodel name\t: Example P2500\n";
  auto const cpus = ParseCpuInfo(text);
  ASSERT_EQ(cpus.size(), 2u);
  EXPECT_EQ(cpus[0].GetNumber(), 0u);
  EXPECT_EQ(*cpus[0].Text("model name"), "Example P2400 @ 2.40GHz");
  EXPECT_THAT(cpus[0].Flags(), ElementsAre("fpu", "lm"));
  EXPECT_TRUE(cpus[0].HasFlag("lm"));
  EXPECT_FALSE(cpus[0].HasFlag("l"));
  EXPECT_EQ(cpus[0].Text("power management").Why().fReason, "/proc/cpuinfo contains no \"power management\"");
  EXPECT_EQ(cpus[1].GetNumber(), 2u);
  EXPECT_EQ(*cpus[1].Text("model name"), "Example P2500");
  EXPECT_THAT(cpus[1].Flags(), IsEmpty());
}

TEST(CpuInfoTest, ArmNamesFlagsDifferently) {
  auto const cpus = ParseCpuInfo("processor : 0\nFeatures : fp asimd\nCPU part : 0xd0c\n");
  ASSERT_EQ(cpus.size(), 1u);
  EXPECT_THAT(cpus[0].Flags(), ElementsAre("fp", "asimd"));
}

TEST(CpuInfoTest, OtherTextsHaveNoCpu) {
  for (char const* text : {"", "\n\n", ":", "processor", "processor : x", "processor 0: version = FF", "model name : x\n"})
    EXPECT_THAT(ParseCpuInfo(text), IsEmpty()) << text;
}

}  // namespace
}  // namespace NQRVZEP20
