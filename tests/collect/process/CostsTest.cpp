// SPDX-License-Identifier: Apache-2.0
#include "collect/process/Costs.h"

#include "collect/answer/TBadAnswer.h"
#include "tests/Support.h"

#include <sys/mman.h>
#include <unistd.h>

namespace NQRVZEP20 {
namespace {

// A piece of memory, all of which is in use. It is the kernel's own mapping, because the allocator may still have memory from
// earlier tests, which would not count as growth.
class TMemory {
public:
  explicit TMemory(std::size_t mebibytes)
      : fBytes(mebibytes * 1024 * 1024),
        fPages(::mmap(nullptr, fBytes, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS | MAP_POPULATE, -1, 0)) {}
  ~TMemory() { ::munmap(fPages, fBytes); }
  TMemory(TMemory const&) = delete;
  TMemory& operator=(TMemory const&) = delete;

private:
  std::size_t const fBytes;
  void* const fPages;
};

TEST(CostsTest, TheHighestGrowthOfTheMemoryIsMeasured) {
  if (kIsSanitized) GTEST_SKIP() << "a sanitizer keeps memory of its own";
  TMemoryMeter meter;
  EXPECT_LT(meter.PeakBytes(), 2'000'000u);
  { TMemory const memory(20); }
  EXPECT_GT(meter.PeakBytes(), 19'000'000u);
  EXPECT_LT(meter.PeakBytes(), 30'000'000u);
  meter.Restart();
  EXPECT_LT(meter.PeakBytes(), 2'000'000u);
}

TEST(CostsTest, EachClassHasTheTimeMemoryAndNumberOfItsInstances) {
  TClassMeter meter;
  meter.Note("X_A");
  ::usleep(20'000);
  meter.Note("X_B");
  TMemory const memory(20);
  meter.Note("X_B");
  meter.Note("X_A");
  std::vector<TClassCost> const costs = meter.Finish();
  ASSERT_EQ(costs.size(), 2u);
  EXPECT_EQ(costs[0].fClass, "X_A");
  EXPECT_EQ(costs[0].fInstances, 2u);
  EXPECT_EQ(costs[1].fClass, "X_B");
  EXPECT_EQ(costs[1].fInstances, 2u);
  EXPECT_GE(costs[1].fMilliseconds, 20);
  if (kIsSanitized) return;
  EXPECT_GT(costs[1].fPeakBytes, 19'000'000u);
}

TEST(CostsTest, ACostIsReadAsItWasWritten) {
  TClassCost const cost = CostFrom(BytesOf({"X_Disk", 12, 3.25, 5'000'000'000}));
  EXPECT_EQ(cost.fClass, "X_Disk");
  EXPECT_EQ(cost.fInstances, 12u);
  EXPECT_DOUBLE_EQ(cost.fMilliseconds, 3.25);
  EXPECT_EQ(cost.fPeakBytes, 5'000'000'000u);
  EXPECT_THROW(CostFrom(""), TBadAnswer);
  EXPECT_THROW(CostFrom(BytesOf({"X_Disk", 1, 1, 1}) + "x"), TBadAnswer);
}

}  // namespace
}  // namespace NQRVZEP20
