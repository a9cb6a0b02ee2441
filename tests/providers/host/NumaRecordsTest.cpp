// SPDX-License-Identifier: Apache-2.0
#include "providers/host/NumaRecords.h"

#include "tests/Support.h"
#include "tests/providers/host/KernelTree.h"
#include "tests/providers/host/Structures.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

TEST(NumaRecordsTest, EachNodeHasItsCpusAndItsMemory) {
  TTempDir const root;
  TKernelTree const tree(root.Path());
  std::string const nodes = "/sys/devices/system/node/";
  tree.Write(nodes + "has_cpu", "0");
  tree.Write(nodes + "node10/cpulist", "");
  tree.Write(nodes + "node2/cpulist", "0-1,8");
  tree.Write(nodes + "node2/meminfo", "Node 2 MemTotal: 4 kB\nNode 2 MemFree: 1 kB");
  tree.Write(nodes + "node2/distance", "10 21");
  tree.Write(nodes + "node10/distance", "21 x");

  auto const found = NumaNodes(TMachineFiles(root.Path()), TSystemName{"db1", "uname"});
  ASSERT_EQ(found.size(), 2u);
  EXPECT_THAT(found[0].fCpus, testing::ElementsAre(0, 1, 8));
  EXPECT_EQ(PropertyOf(found[0].fRecord, "DeviceID"), "string NUMA node 2");
  EXPECT_EQ(PropertyOf(found[0].fRecord, "NumberOfBlocks"), "uint64 4096");
  EXPECT_EQ(PropertyOf(found[0].fRecord, "FreeMemory"), "uint64 1024");
  EXPECT_EQ(PropertyOf(found[0].fRecord, "CPUs"), "string 0-1,8");
  EXPECT_EQ(PropertyOf(found[0].fRecord, "Distances"), "uint32 { 10, 21 }");
  EXPECT_THAT(found[1].fCpus, testing::IsEmpty());
  EXPECT_EQ(PropertyOf(found[1].fRecord, "CPUs"), "string NULL not-given: " + nodes + "node10/cpulist is empty");
  EXPECT_EQ(PropertyOf(found[1].fRecord, "Distances"), "uint32 NULL unexpected-form: \"21 x\" is not a list of distances");
}

}  // namespace
}  // namespace NQRVZEP20
