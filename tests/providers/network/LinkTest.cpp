// SPDX-License-Identifier: Apache-2.0
#include "providers/network/Link.h"

#include "tests/Support.h"
#include "tests/providers/network/NetlinkBytes.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <linux/if_arp.h>
#include <linux/if_link.h>
#include <linux/rtnetlink.h>

namespace NQRVZEP20 {
namespace {

using testing::ElementsAre;

std::string LinkMessage(int index, std::string const& attributes) {
  ifinfomsg header = {};
  header.ifi_index = index;
  header.ifi_type = ARPHRD_ETHER;
  header.ifi_flags = IFF_UP;
  return Message(RTM_NEWLINK, BytesOf(header) + attributes);
}

std::string Named(std::string const& name) { return TextAttribute(IFLA_IFNAME, name); }

std::vector<std::string> NamesIn(std::string const& dump) {
  std::vector<std::string> names;
  for (TLink const& link : LinksIn(dump).fAll) names.push_back(link.fName);
  return names;
}

TEST(LinkTest, ValuesAreThoseOfTheAttributes) {
  rtnl_link_stats64 counters = {};
  counters.rx_packets = 1;
  counters.tx_dropped = 1ull << 40;
  std::string const vlan = NumberAttribute(IFLA_VLAN_ID, std::uint16_t(10)) +
                           NumberAttribute(IFLA_VLAN_PROTOCOL, std::uint16_t(0x0081)) +  // 0x8100, in network order
                           NumberAttribute(IFLA_VLAN_FLAGS, ifla_vlan_flags{1, ~0u});
  TLinks const links = LinksIn(
      LinkMessage(3, Named("eth0.10") + Attribute(IFLA_ADDRESS, "\x52\x54\x00\xab\xcd\xef"s) +
                         NumberAttribute(IFLA_MTU, std::uint32_t(1500)) + NumberAttribute(IFLA_LINK, std::uint32_t(2)) +
                         NumberAttribute(IFLA_OPERSTATE, std::uint8_t(6)) + TextAttribute(IFLA_IFALIAS, "to <b>switch 2</b>") +
                         Attribute(IFLA_STATS64, BytesOf(counters)) +
                         Attribute(IFLA_PROP_LIST | NLA_F_NESTED,
                                   TextAttribute(IFLA_ALT_IFNAME, "left") + TextAttribute(IFLA_ALT_IFNAME, "enp1s0")) +
                         Attribute(IFLA_LINKINFO, TextAttribute(IFLA_INFO_KIND, "vlan") + Attribute(IFLA_INFO_DATA, vlan))) +
      LinkMessage(2, Named("eth0")) + End());
  ASSERT_EQ(links.fAll.size(), 2u);
  TLink const& link = links.fAll[0];
  EXPECT_EQ(link.fName, "eth0.10");
  EXPECT_EQ(*link.fIndex, 3u);
  EXPECT_EQ(*link.fType, ARPHRD_ETHER);
  EXPECT_EQ(*link.fFlags, unsigned(IFF_UP));
  EXPECT_EQ(*link.fAddress, "525400abcdef");
  EXPECT_EQ(*link.fMtu, 1500u);
  EXPECT_EQ(*link.fOperState, 6);
  EXPECT_EQ(*link.fAlias, "to <b>switch 2</b>");
  EXPECT_THAT(link.fOtherNames, ElementsAre("left", "enp1s0"));
  EXPECT_TRUE(link.IsKind("vlan"));
  EXPECT_EQ(*link.fVlanId, 10);
  EXPECT_EQ(*link.fVlanProtocol, 0x8100);
  EXPECT_EQ(*link.fVlanFlags, 1u);
  EXPECT_EQ(link.fCounters->fReceivedPackets, 1u);
  EXPECT_EQ(link.fCounters->fSendDrops, 1ull << 40);
  EXPECT_EQ(*links.NameOf(link.fLower), "eth0");
  EXPECT_EQ(link.fMaster.Why().fReason, "the kernel does not report it");
  EXPECT_EQ(links.fSource, "rtnetlink");
  EXPECT_FALSE(links.fWhyNotAll);
}

TEST(LinkTest, AnIndexOfAnotherNamespaceNamesNoInterface) {
  TLinks const links = LinksIn(LinkMessage(2, Named("eth0")) +
                               LinkMessage(3, Named("veth0") + NumberAttribute(IFLA_LINK, std::uint32_t(2)) +
                                                  NumberAttribute(IFLA_LINK_NETNSID, std::int32_t(0))) +
                               LinkMessage(4, Named("veth1") + NumberAttribute(IFLA_LINK, std::uint32_t(99))));
  EXPECT_EQ(links.NameOf(links.fAll[1].fLower).Why().fReason, "the interface below is in another network namespace");
  EXPECT_EQ(links.NameOf(links.fAll[2].fLower).Why().fReason, "the kernel lists no interface with index 99");
}

TEST(LinkTest, HostileNamesAreKeptOnce) {
  EXPECT_THAT(NamesIn(LinkMessage(1, Named("a<b>\x1b[31m")) + LinkMessage(2, Named("eth0")) + LinkMessage(3, Named("eth0")) +
                      LinkMessage(4, Named("")) + LinkMessage(5, "") + LinkMessage(6, Attribute(IFLA_IFNAME, "no-zero"))),
              ElementsAre("a<b>\x1b[31m", "eth0", "no-zero"));
}

TEST(LinkTest, ShortCountersAreMissing) {
  auto const counters = [](std::size_t size) {
    std::string const bytes = BytesOf(rtnl_link_stats64{}).substr(0, size);
    return LinksIn(LinkMessage(1, Named("eth0") + Attribute(IFLA_STATS64, bytes))).fAll.at(0).fCounters;
  };
  EXPECT_TRUE(counters(offsetof(rtnl_link_stats64, rx_compressed)));
  EXPECT_FALSE(counters(offsetof(rtnl_link_stats64, rx_compressed) - 1));
  EXPECT_FALSE(counters(0));
}

TEST(LinkTest, AThousandInterfacesAreDescribed) {
  std::string dump;
  for (int index = 1; index <= 1003; ++index) dump += LinkMessage(index, Named("veth" + std::to_string(index)));
  TLinks const links = LinksIn(dump + End());
  EXPECT_EQ(links.fAll.size(), 1000u);
  ASSERT_TRUE(links.fWhyNotAll);
  EXPECT_EQ(links.fWhyNotAll->fCode, "too-many");
  EXPECT_EQ(links.fWhyNotAll->fReason, "the kernel lists 1003 interfaces; the first 1000 are described");
}

TEST(LinkTest, AnAddressOfZerosIsAPlaceholder) {
  EXPECT_EQ(*AddressText("\x00\x01\xff"s), "0001ff");
  EXPECT_EQ(AddressText(std::string(6, '\0')).Why().fCode, "placeholder");
  EXPECT_EQ(AddressText("").Why().fReason, "the interface has no such address");
}

// ---- sysfs beside rtnetlink ----

class LinkFilesTest : public testing::Test {
protected:
  void Write(std::string const& path, std::string const& text) {
    std::filesystem::create_directories(std::filesystem::path(fDir.Path(path)).parent_path());
    WriteFile(fDir.Path(path), text);
  }

  TTempDir fDir;
  TMachineFiles fFiles{fDir.Path()};
};

TEST_F(LinkFilesTest, SysfsOfAnotherNetworkNamespaceIsNotRead) {
  Write("zep-answers/netlink/links",
        LinkMessage(2, Named("eth0")) + LinkMessage(3, Named("eth1")) + LinkMessage(4, Named("eth2")));
  Write("sys/class/net/eth0/ifindex", "2\n");
  Write("sys/class/net/eth0/mtu", "1500\n");
  Write("sys/class/net/eth1/ifindex", "7\n");
  Write("sys/class/net/eth1/mtu", "1500\n");
  TLinks const links = LinksOf(fFiles);
  EXPECT_EQ(*TLinkFiles(fFiles, links.fAll.at(0)).Number<int>("mtu"), 1500);
  for (int other : {1, 2}) {
    EXPECT_EQ(TLinkFiles(fFiles, links.fAll.at(other)).Number<int>("mtu").Why().fReason,
              "/sys/class/net does not describe this network namespace");
  }
}

TEST_F(LinkFilesTest, SettingsAreTheFirstWordsOfTheirFiles) {
  Write("sys/class/net/bond0/bonding/arp_validate", "none 0\n");
  Write("sys/class/net/bond0/bonding/use_carrier", "1\n");
  TLink link;
  link.fName = "bond0";
  link.fIsInSysfs = true;
  TLinkFiles const files(fFiles, link);
  EXPECT_THAT(*files.Settings("bonding", {"arp_validate", "missing", "use_carrier"}),
              ElementsAre("arp_validate: none", "use_carrier: 1"));
  EXPECT_EQ(files.Settings("bonding", {"missing"}).Why().fReason, "/sys/class/net/bond0/bonding/missing does not exist");
}

TEST_F(LinkFilesTest, WithoutRtnetlinkSysfsIsRead) {
  Write("sys/class/net/eth0/ifindex", "2\n");
  TLinks const links = LinksOf(fFiles);
  EXPECT_EQ(links.fSource, "sysfs");
  EXPECT_EQ(links.fAll.at(0).fName, "eth0");
}

}  // namespace
}  // namespace NQRVZEP20
