// SPDX-License-Identifier: Apache-2.0
#include "providers/network/Link.h"

#include "tests/Support.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

TMissing const kRefused{kMissingUnreadable, "netlink: the kernel refuses the socket: Operation not permitted"};

class SysfsLinksTest : public testing::Test {
protected:
  void Write(std::string const& path, std::string const& text) {
    std::filesystem::create_directories(std::filesystem::path(fDir.Path(path)).parent_path());
    WriteFile(fDir.Path(path), text);
  }

  TLinks Links() const { return LinksInSysfs(TMachineFiles(fDir.Path()), kRefused); }

  TTempDir fDir;
};

TEST_F(SysfsLinksTest, ValuesAreThoseOfTheFiles) {
  std::string const directory = "sys/class/net/eth0.10/";
  for (auto const& [file, text] : std::map<std::string, std::string>{{"ifindex", "5"},
                                                                     {"iflink", "2"},
                                                                     {"type", "1"},
                                                                     {"flags", "0x1043"},
                                                                     {"operstate", "lowerlayerdown"},
                                                                     {"carrier", "0"},
                                                                     {"address", "52:54:00:ab:cd:ef"},
                                                                     {"broadcast", "ff:ff:ff:ff:ff:ff"},
                                                                     {"mtu", "1500"},
                                                                     {"ifalias", "uplink"},
                                                                     {"uevent", "INTERFACE=eth0.10\nDEVTYPE=vlan"},
                                                                     {"carrier_changes", "4"}})
    Write(directory + file, text + "\n");
  Write("proc/net/vlan/config",
        "VLAN Dev name	 | VLAN ID\nName-Type: VLAN_NAME_TYPE_RAW_PLUS_VID_NO_PAD\neth0.10        | 10  | eth0\n");
  Write("sys/class/net/eth0/ifindex", "2\n");
  Write("sys/class/net/eth0/iflink", "2\n");
  Write("sys/class/net/bonding_masters", "bond0\n");

  TLinks const links = Links();
  ASSERT_EQ(links.fAll.size(), 2u) << "in the order of the indices, without bonding_masters";
  EXPECT_EQ(links.fAll[0].fName, "eth0");
  EXPECT_FALSE(links.fAll[0].fLower) << "its own index";
  TLink const& link = links.fAll[1];
  EXPECT_EQ(*link.fType, 1);
  EXPECT_EQ(*link.fFlags, 0x1043u);
  EXPECT_EQ(*link.fOperState, 3);
  EXPECT_FALSE(*link.fHasCarrier);
  EXPECT_EQ(*link.fAddress, "525400abcdef");
  EXPECT_EQ(*link.fBroadcast, "ffffffffffff");
  EXPECT_EQ(*link.fMtu, 1500u);
  EXPECT_EQ(*link.fAlias, "uplink");
  EXPECT_TRUE(link.IsKind("vlan"));
  EXPECT_EQ(*links.NameOf(link.fLower), "eth0");
  EXPECT_EQ(*link.fVlanId, 10);
  EXPECT_EQ(*link.fCarrierChanges, 4u);
  EXPECT_EQ(link.fQueueDiscipline.Why().fReason, kRefused.fReason);
  EXPECT_EQ(link.fCounters.Why().fReason, "/sys/class/net/eth0.10/statistics/rx_packets does not exist");
}

TEST_F(SysfsLinksTest, WordsThatAreNoneOfTheKernelAreMissing) {
  Write("sys/class/net/eth0/ifindex", "2\n");
  Write("sys/class/net/eth0/operstate", "sideways\n");
  Write("sys/class/net/eth0/address", "00:00:00:00:00:00\n");
  Write("sys/class/net/eth0/uevent", "INTERFACE=eth0\n");
  Write("proc/net/vlan/config", "eth0 | 99999 | eth1\n");
  TLink const link = Links().fAll.at(0);
  EXPECT_EQ(link.fOperState.Why().fReason, "\"sideways\" is not an operational state");
  EXPECT_EQ(link.fAddress.Why().fCode, "placeholder");
  EXPECT_FALSE(link.fKind);
  EXPECT_FALSE(link.fVlanId);
}

TEST_F(SysfsLinksTest, ADeviceIsNotAVirtualInterface) {
  Write("sys/class/net/wlan0/ifindex", "2\n");
  Write("sys/class/net/wlan0/uevent", "DEVTYPE=wlan\n");
  Write("sys/class/net/wlan0/phys_port_name", "p0\n");
  EXPECT_TRUE(Links().fAll.at(0).IsKind("wlan"));
  Write("sys/devices/0000:01:00.0/vendor", "0x8086\n");
  std::filesystem::create_symlink("/sys/devices/0000:01:00.0", fDir.Path("sys/class/net/wlan0/device"));
  TLink const link = Links().fAll.at(0);
  EXPECT_FALSE(link.fKind);
  EXPECT_EQ(*link.fParentDevice, "0000:01:00.0");
  EXPECT_EQ(*link.fPhysicalPort, "p0");
}

TEST_F(SysfsLinksTest, WithoutSysfsTheReasonNamesBoth) {
  EXPECT_EQ(Links().fWhyNotAll->fReason,
            "netlink: the kernel refuses the socket: Operation not permitted; and /sys/class/net lists no interface");
}

}  // namespace
}  // namespace NQRVZEP20
