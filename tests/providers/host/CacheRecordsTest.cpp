// SPDX-License-Identifier: Apache-2.0
#include "providers/host/CacheRecords.h"

#include "tests/Support.h"
#include "tests/providers/host/KernelTree.h"
#include "tests/providers/host/Structures.h"

#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

TEST(CacheRecordsTest, EachCacheIsListedOnce) {
  TTempDir const root;
  TKernelTree(root.Path()).Sockets(1, 2, 2);
  TMachineFiles const files(root.Path());
  auto const caches = CachesOf(*TKernelProcessors::ReadFrom(files), files);
  std::string text;
  for (TCache const& cache : caches) text += *TFinding<std::string>(cache.fName) + "; ";
  EXPECT_EQ(text, "L1d 0; L1i 0; L2 0; L3 0; L1d 1; L1i 1; L2 1; ");

  TRecord const l1 = CacheRecord(caches[0], TSystemName{"db1", "uname"});
  EXPECT_EQ(PropertyOf(l1, "DeviceID"), "string L1d 0 cache");
  EXPECT_EQ(PropertyOf(l1, "ElementName"), "string L1d 0 cache of CPU 0,2");
  EXPECT_EQ(PropertyOf(l1, "NumberOfBlocks"), "uint64 49152");
  TRecord const l3 = CacheUse(caches[3]);
  EXPECT_EQ(PropertyOf(l3, "Level"), "uint16 5");
  EXPECT_EQ(PropertyOf(l3, "CacheType"), "uint16 4");
  EXPECT_EQ(PropertyOf(l3, "LineSize"), "uint32 64");
  EXPECT_EQ(PropertyOf(l3, "Associativity"), "uint16 8");
}

TEST(CacheRecordsTest, SizesAreInBytes) {
  EXPECT_EQ(*CacheSizeFrom("48K"), 49152u);
  EXPECT_EQ(*CacheSizeFrom("16M"), 16777216u);
  for (char const* text : {"", "K", "48", "48G", "48 K", "-1K", "99999999999999999999K", "9999999999999999K"})
    EXPECT_EQ(CacheSizeFrom(text).Why().fReason, "\"" + std::string(text) + "\" is not the size of a cache") << text;
}

}  // namespace
}  // namespace NQRVZEP20
