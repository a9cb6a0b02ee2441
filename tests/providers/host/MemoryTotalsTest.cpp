// SPDX-License-Identifier: Apache-2.0
#include "providers/host/MemoryTotals.h"

#include "tests/providers/host/Structures.h"

#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

TEST(MemoryTotalsTest, LinesAreFoundByTheirNames) {
  TMemInfo const info("/proc/meminfo", std::string("MemTotal:         982224 kB\nMemFree: 5 kB\nHugePages_Total:  3\nno line\n"));
  EXPECT_EQ(*info.Kilobytes("MemTotal"), 982224u);
  EXPECT_EQ(*info.Bytes("MemTotal"), 1005797376u);
  EXPECT_EQ(*info.Kilobytes("HugePages_Total"), 3u);
  EXPECT_EQ(info.Kilobytes("SwapTotal").Why().fReason, "/proc/meminfo contains no SwapTotal");
  EXPECT_EQ(PropertyOf(MainMemoryRecord(info, TSystemName{"db1", "uname"}), "NumberOfBlocks"), "uint64 1005797376");
}

TEST(MemoryTotalsTest, ANodeHasItsNumberBeforeTheName) {
  TMemInfo const info("meminfo", std::string("Node 0 MemTotal:      507416 kB\nNode 0 MemFree: 1 kB"));
  EXPECT_EQ(*info.Kilobytes("MemTotal"), 507416u);
  EXPECT_EQ(*info.Kilobytes("MemFree"), 1u);
}

TEST(MemoryTotalsTest, LinesWithoutANumberAreIgnored) {
  TMemInfo const info("meminfo", std::string("MemTotal: kB\nMemFree\nSwapTotal: 99999999999999999999999 kB\n:\n"));
  for (char const* name : {"MemTotal", "MemFree", "SwapTotal", ""}) EXPECT_FALSE(info.Kilobytes(name)) << name;
}

TEST(MemoryTotalsTest, AnUnreadableFileIsTheReason) {
  TMemInfo const info("meminfo", TMissing{kMissingUnreadable, "why"});
  EXPECT_EQ(info.Bytes("MemTotal").Why().fReason, "why");
}

}  // namespace
}  // namespace NQRVZEP20
