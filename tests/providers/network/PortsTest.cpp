// SPDX-License-Identifier: Apache-2.0
#include "providers/network/Ports.h"

#include "tests/Support.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <linux/if_arp.h>

namespace NQRVZEP20 {
namespace {

using namespace std::string_literals;

class PortsTest : public testing::Test {
protected:
  void Write(std::string const& path, std::string const& text) {
    std::filesystem::create_directories(std::filesystem::path(fDir.Path(path)).parent_path());
    WriteFile(fDir.Path(path), text);
  }

  void Link(std::string const& path, std::string const& target) {
    std::filesystem::create_directories(std::filesystem::path(fDir.Path(path)).parent_path());
    std::filesystem::create_symlink(target, fDir.Path(path));
  }

  // A device of the directory, which is of the bus.
  void AddDevice(std::string const& directory, std::string const& bus) { Link(directory + "/subsystem", "/sys/bus/" + bus); }

  // The only port: an interface "eth0" of the device.
  TPort PortOn(std::string const& device) {
    for (char const* bus : {"pci", "usb", "virtio", "platform"}) std::filesystem::create_directories(fDir.Path("sys/bus/") + bus);
    Write("sys/class/net/eth0/ifindex", "2\n");
    Link("sys/class/net/eth0/device", "/" + device);
    TLinks links{"sysfs", {fLink}, {}};
    links.fAll[0].fParentDevice = device.substr(device.rfind('/') + 1);
    return PortsOf(TMachineFiles(fDir.Path()), links).at(0);
  }

  TTempDir fDir;
  TLink fLink = [] {
    TLink link;
    link.fName = "eth0";
    link.fType = std::uint16_t(ARPHRD_ETHER);
    link.fIsInSysfs = true;
    return link;
  }();
};

TEST_F(PortsTest, TheControllerIsTheNearestPciDevice) {
  AddDevice("sys/devices/pci0000:00/0000:00:01.0", "pci");
  AddDevice("sys/devices/pci0000:00/0000:00:01.0/0000:01:00.0", "pci");
  AddDevice("sys/devices/pci0000:00/0000:00:01.0/0000:01:00.0/virtio0", "virtio");
  EXPECT_EQ(*PortOn("sys/devices/pci0000:00/0000:00:01.0/0000:01:00.0/virtio0").fPciAddress, "0000:01:00.0");
}

TEST_F(PortsTest, APortOfTheUsbBusHasNoPciAddress) {
  AddDevice("sys/devices/pci0000:00/0000:00:02.0", "pci");
  AddDevice("sys/devices/pci0000:00/0000:00:02.0/usb1/1-1", "usb");
  EXPECT_EQ(PortOn("sys/devices/pci0000:00/0000:00:02.0/usb1/1-1").fPciAddress.Why().fReason,
            "the port is not a device of the PCI bus");
}

TEST_F(PortsTest, WithoutAnAnswerOfTheDriverSpeedAndDuplexAreThoseOfSysfs) {
  struct TRow {
    char const *fSpeed, *fDuplex, *fSpeedText, *fDuplexText;
  } const rows[] = {
      {"1000", "full", "1000000000", "1"},
      {"10", "half", "10000000", "0"},
      {"-1", "unknown", "the driver reports the speed as unknown", "the driver reports the duplex mode as unknown"},
      {"4294967295", "", "the driver reports the speed as unknown", "/sys/class/net/eth0/duplex is empty"},
  };
  AddDevice("sys/devices/platform/nic", "platform");
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fSpeed);
    Write("sys/class/net/eth0/speed", row.fSpeed + "\n"s);
    Write("sys/class/net/eth0/duplex", row.fDuplex + "\n"s);
    std::filesystem::remove(fDir.Path("sys/class/net/eth0/device"));
    TLinkSettings const settings = PortOn("sys/devices/platform/nic").fSettings;
    EXPECT_EQ(settings.fSpeed ? std::to_string(*settings.fSpeed) : settings.fSpeed.Why().fReason, row.fSpeedText);
    EXPECT_EQ(settings.fIsFullDuplex ? std::to_string(*settings.fIsFullDuplex) : settings.fIsFullDuplex.Why().fReason,
              row.fDuplexText);
  }
}

TEST_F(PortsTest, WithoutACarrierThatIsTheReasonForAMissingSpeed) {
  AddDevice("sys/devices/platform/nic", "platform");
  Write("sys/class/net/eth0/speed", "-1\n");
  fLink.fHasCarrier = false;
  TLinkSettings const settings = PortOn("sys/devices/platform/nic").fSettings;
  EXPECT_EQ(settings.fSpeed.Why().fReason, "the port has no carrier");
  EXPECT_EQ(settings.fIsFullDuplex.Why().fReason, "the port has no carrier");
}

TEST_F(PortsTest, WirelessPortsAreNotEthernet) {
  AddDevice("sys/devices/platform/nic", "platform");
  EXPECT_TRUE(PortOn("sys/devices/platform/nic").IsEthernet());
  Write("sys/class/net/eth0/phy80211/name", "phy0\n");
  std::filesystem::remove(fDir.Path("sys/class/net/eth0/device"));
  EXPECT_FALSE(PortOn("sys/devices/platform/nic").IsEthernet());
  fLink.fType = std::uint16_t(ARPHRD_INFINIBAND);
  std::filesystem::remove(fDir.Path("sys/class/net/eth0/device"));
  EXPECT_FALSE(PortOn("sys/devices/platform/nic").IsEthernet());
}

TEST_F(PortsTest, VirtualInterfacesAreNoPorts) {
  TLinks const links{"sysfs", {fLink}, {}};
  EXPECT_THAT(PortsOf(TMachineFiles(fDir.Path()), links), testing::IsEmpty());
}

}  // namespace
}  // namespace NQRVZEP20
