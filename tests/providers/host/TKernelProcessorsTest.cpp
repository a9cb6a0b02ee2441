// SPDX-License-Identifier: Apache-2.0
#include "providers/host/TKernelProcessors.h"

#include "providers/host/CpuList.h"
#include "tests/Support.h"
#include "tests/providers/host/KernelTree.h"

#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

class TKernelProcessorsTest : public testing::Test {
protected:
  // The cores of each socket: "[0,2 1,3] [4,6 5,7] ".
  std::string Text() {
    auto const processors = TKernelProcessors::ReadFrom(TMachineFiles(fRoot.Path()));
    if (!processors) return processors.Why().fReason;
    std::string text;
    for (auto const& socket : processors->GetSockets()) {
      text += "[";
      for (auto const& core : socket.fCores) text += (text.back() == '[' ? "" : " ") + CpuListOf(core.fCpus);
      text += "] ";
    }
    return text;
  }

  TTempDir fRoot;
  TKernelTree fTree{fRoot.Path()};
};

TEST_F(TKernelProcessorsTest, CpusAreSortedIntoCoresAndSockets) {
  fTree.Sockets(2, 2, 2);
  EXPECT_EQ(Text(), "[0,4 1,5] [2,6 3,7] ");
  auto const processors = TKernelProcessors::ReadFrom(TMachineFiles(fRoot.Path()));
  EXPECT_EQ(CpuListOf(processors->GetSockets()[1].Cpus()), "2-3,6-7");
  EXPECT_EQ(processors->GetSockets()[1].FirstCpu(), 2u);
  EXPECT_EQ(*processors->GetSockets()[1].fInfo.Text("physical id"), "1");
}

TEST_F(TKernelProcessorsTest, SocketsAreInNumericOrder) {
  fTree.Write("/proc/cpuinfo", "processor : 0\nphysical id : 10\n\nprocessor : 1\nphysical id : 9\n");
  EXPECT_EQ(Text(), "[1] [0] ");
}

TEST_F(TKernelProcessorsTest, TheTopologyMayComeFromSysfsAlone) {
  fTree.Write("/proc/cpuinfo", "processor : 0\n\nprocessor : 1\n\nprocessor : 2\n");
  EXPECT_EQ(Text(), "[0 1 2] ") << "without a topology, each CPU is a core of the same socket";
  fTree.Write("/sys/devices/system/cpu/cpu2/topology/physical_package_id", "1");
  fTree.Write("/sys/devices/system/cpu/cpu0/topology/thread_siblings_list", "0-1");
  EXPECT_EQ(Text(), "[0-1] [2] ");
}

TEST_F(TKernelProcessorsTest, CpusThatAreOfflineAreLeftOut) {
  fTree.Write("/proc/cpuinfo", "processor : 0\n");
  fTree.Write("/sys/devices/system/cpu/cpu0/topology/core_cpus_list", "0-1");
  EXPECT_EQ(Text(), "[0] ");
}

TEST_F(TKernelProcessorsTest, AListWithoutTheCpuIsNotUsed) {
  fTree.Write("/proc/cpuinfo", "processor : 0\n\nprocessor : 1\n");
  fTree.Write("/sys/devices/system/cpu/cpu0/topology/core_cpus_list", "7");
  EXPECT_EQ(Text(), "[0 1] ");
}

TEST_F(TKernelProcessorsTest, WithoutCpusThereIsAReason) {
  EXPECT_EQ(Text(), "/proc/cpuinfo does not exist");
  fTree.Write("/proc/cpuinfo", "nothing");
  EXPECT_EQ(Text(), "/proc/cpuinfo lists no CPU");
}

}  // namespace
}  // namespace NQRVZEP20
