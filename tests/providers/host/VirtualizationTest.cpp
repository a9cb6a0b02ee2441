// SPDX-License-Identifier: Apache-2.0
#include "providers/host/Virtualization.h"

#include "providers/host/TKernelProcessors.h"
#include "tests/Support.h"
#include "tests/providers/host/KernelTree.h"
#include "tests/providers/host/Structures.h"

#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

class VirtualizationTest : public testing::Test {
protected:
  std::string Property(char const* name) {
    TMachineFiles const files(fRoot.Path());
    return PropertyOf(VirtualizationRecord(files, TKernelProcessors::ReadFrom(files)), name);
  }
  void Flags(std::string const& flags) { fTree.Write("/proc/cpuinfo", "processor : 0\nflags : " + flags); }

  TTempDir fRoot;
  TKernelTree fTree{fRoot.Path()};
};

TEST_F(VirtualizationTest, HardwareHasNoHypervisor) {
  Flags("fpu lm");
  fTree.Write("/sys/class/dmi/id/sys_vendor", "Example Works");
  EXPECT_EQ(Property("IsVirtual"), "boolean false");
  EXPECT_EQ(Property("Hypervisor"), "string NULL not-applicable: the machine is not virtual");
  EXPECT_EQ(Property("Container"), "string NULL not-applicable: the system does not run in a container");
}

TEST_F(VirtualizationTest, TheSignatureOfTheProcessorNamesTheHypervisor) {
  Flags("fpu hypervisor");
  EXPECT_EQ(Property("IsVirtual"), "boolean true");
  EXPECT_EQ(Property("Hypervisor"), "string NULL not-given: the hypervisor does not report its name");
  std::filesystem::create_directories(fRoot.Path() + "/zep-answers/cpuid");
  WriteFile(fRoot.Path() + "/zep-answers/cpuid/hypervisor", "KVMKVMKVM");
  EXPECT_EQ(Property("Hypervisor"), "string KVM");
}

TEST_F(VirtualizationTest, FirmwareNamesTheHypervisor) {
  struct TRow {
    char const *fFile, *fText, *fHypervisor;
  } const rows[] = {{"chassis_vendor", "QEMU", "string QEMU"},
                    {"sys_vendor", "VMware, Inc.", "string VMware"},
                    {"product_name", "Virtual Machine", "string Microsoft Hyper-V"},
                    {"product_name", "VirtualBox", "string VirtualBox"}};
  for (TRow const& row : rows) {
    Flags("fpu");
    fTree.Write("/sys/class/dmi/id/sys_vendor", "");
    fTree.Write("/sys/class/dmi/id/chassis_vendor", "");
    fTree.Write(std::string("/sys/class/dmi/id/") + row.fFile, row.fText);
    EXPECT_EQ(Property("Hypervisor"), row.fHypervisor);
    EXPECT_EQ(Property("IsVirtual"), "boolean true");
  }
}

TEST_F(VirtualizationTest, TheControlDomainOfXenHasTheHardware) {
  Flags("fpu hypervisor");
  fTree.Write("/sys/hypervisor/type", "xen");
  EXPECT_EQ(Property("Hypervisor"), "string Xen");
  EXPECT_EQ(Property("IsVirtual"), "boolean true");
  fTree.Write("/proc/xen/capabilities", "control_d");
  EXPECT_EQ(Property("IsVirtual"), "boolean false");
}

TEST_F(VirtualizationTest, AContainerIsNamedByItsManager) {
  Flags("fpu");
  fTree.Write("/proc/1/cgroup", "0::/docker/0123abcd");
  EXPECT_EQ(Property("Container"), "string docker");
  fTree.Write("/run/.containerenv", "");
  EXPECT_EQ(Property("Container"), "string podman");
  fTree.Write("/run/systemd/container", "systemd-nspawn");
  EXPECT_EQ(Property("Container"), "string systemd-nspawn");
}

TEST_F(VirtualizationTest, WithoutFilesNothingIsKnown) {
  EXPECT_EQ(Property("IsVirtual"), "boolean NULL not-given: /proc/cpuinfo does not exist");
  EXPECT_EQ(Property("Hypervisor"), "string NULL not-given: /proc/cpuinfo does not exist");
}

}  // namespace
}  // namespace NQRVZEP20
