// SPDX-License-Identifier: Apache-2.0

// The namespace that the provider fills from the files of recorded machines.

#include "providers/devices/DevicesNamespace.h"

#include "providers/reasons/TMachineFiles.h"
#include "tests/Machines.h"
#include "tests/providers/NamespaceText.h"

namespace NQRVZEP20 {
namespace {

class DevicesNamespaceTest : public testing::Test {
protected:
  void Fill(std::string const& root) { FillDevicesNamespace(TMachineFiles(root), *fNs); }

  TEnvironmentGuard fUnnamed{"ZEP_HOST_NAME", nullptr};
  boost::shared_ptr<TMemoryNamespace> fNs = NewNamespace();
};

TEST_F(DevicesNamespaceTest, AServerHasItsDevicesAndTheirConnections) {
  TRecordedMachine const server("server");
  Fill(server.Root());
  ExpectTextOf(*fNs, "tests/providers/devices/server.txt");
}

TEST_F(DevicesNamespaceTest, AMachineWithoutFilesHasReasons) {
  TTempDir const nothing;
  Fill(nothing.Path());
  TReasonReader const reasons(*fNs);
  EXPECT_EQ(reasons.WhyNoInstance("CIM_PCIDevice")->fReason,
            "the kernel lists no PCI devices: /sys/bus/pci/devices/ does not exist");
  EXPECT_EQ(reasons.WhyNoInstance("CIM_USBHub")->fReason,
            "the kernel lists no USB devices: /sys/bus/usb/devices/ does not exist");
  EXPECT_EQ(reasons.WhyNoInstance("CIM_Slot")->fReason, "the kernel lists no PCI slots in /sys/bus/pci/slots");
  EXPECT_EQ(reasons.WhyNoInstance("ZEP_PCIExpressLink")->fReason,
            "the kernel lists no PCI devices: /sys/bus/pci/devices/ does not exist");
  EXPECT_EQ(reasons.WhyNoInstance("ZEP_PCIExpressLink")->fCode, kMissingNoSource) << "no rule about links can be asked";
  EXPECT_EQ(TextOf(*fNs), "CIM_ComputerSystem.CreationClassName=\"CIM_ComputerSystem\"\n");
}

}  // namespace
}  // namespace NQRVZEP20
