// SPDX-License-Identifier: Apache-2.0
#include "providers/network/Address.h"

#include "tests/providers/network/NetlinkBytes.h"

#include <arpa/inet.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <linux/if_addr.h>
#include <linux/rtnetlink.h>

namespace NQRVZEP20 {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

TLinks OneLink() {
  TLink link;
  link.fName = "eth0";
  link.fIndex = 2u;
  return {"rtnetlink", {link}, {}};
}

std::string Ip(std::string const& text) {
  in6_addr bytes = {};
  bool const isIPv6 = text.find(':') != std::string::npos;
  EXPECT_EQ(::inet_pton(isIPv6 ? AF_INET6 : AF_INET, text.c_str(), &bytes), 1) << text;
  return BytesOf(bytes).substr(0, isIPv6 ? 16 : 4);
}

std::string AddressMessage(std::string const& address, int prefixLength, std::string const& more = "", std::uint32_t index = 2) {
  ifaddrmsg header = {};
  header.ifa_family = address.find(':') != std::string::npos ? AF_INET6 : AF_INET;
  header.ifa_prefixlen = static_cast<std::uint8_t>(prefixLength);
  header.ifa_flags = IFA_F_PERMANENT;
  header.ifa_index = index;
  return Message(RTM_NEWADDR, BytesOf(header) + Attribute(IFA_ADDRESS, Ip(address)) + more);
}

std::vector<std::string> NamesIn(std::string const& dump) {
  std::vector<std::string> names;
  for (TAddress const& address : AddressesIn(dump, OneLink()).fAll) names.push_back(address.Name());
  return names;
}

TEST(AddressTest, ValuesAreThoseOfTheAttributes) {
  ifa_cacheinfo const lifetimes{1800, 3600, 0, 0};
  auto const addresses = AddressesIn(
      AddressMessage("192.0.2.9", 24,
                     Attribute(IFA_LOCAL, Ip("192.0.2.10")) + Attribute(IFA_BROADCAST, Ip("192.0.2.255")) +
                         TextAttribute(IFA_LABEL, "eth0:1") + NumberAttribute(IFA_FLAGS, std::uint32_t(IFA_F_NOPREFIXROUTE)) +
                         Attribute(IFA_CACHEINFO, BytesOf(lifetimes))),
      OneLink());
  ASSERT_EQ(addresses.fAll.size(), 1u);
  TAddress const& address = addresses.fAll[0];
  EXPECT_EQ(address.Name(), "eth0 192.0.2.10/24");
  EXPECT_EQ(*address.fPeer, "192.0.2.9");
  EXPECT_EQ(*address.fBroadcast, "192.0.2.255");
  EXPECT_EQ(*address.fLabel, "eth0:1");
  EXPECT_EQ(address.fFlags, unsigned(IFA_F_NOPREFIXROUTE));
  EXPECT_EQ(*address.fPreferredSeconds, 1800u);
  EXPECT_EQ(*address.fValidSeconds, 3600u);
}

TEST(AddressTest, OnlyValidAddressesOfKnownInterfacesAreKept) {
  EXPECT_THAT(
      NamesIn(AddressMessage("192.0.2.1", 33) + AddressMessage("2001:db8::1", 129) + AddressMessage("192.0.2.2", 24, "", 3) +
              AddressMessage("192.0.2.3", 32) + AddressMessage("192.0.2.3", 32) + AddressMessage("2001:db8::2", 128) +
              AddressMessage("192.0.2.4", 24, Attribute(IFA_LOCAL, Ip("::1"))) + Message(RTM_NEWADDR, "abc")),
      ElementsAre("eth0 192.0.2.3/32", "eth0 2001:db8::2/128"));
  EXPECT_THAT(NamesIn(Message(RTM_NEWADDR, BytesOf(ifaddrmsg{AF_INET, 24, 0, 0, 2}))), IsEmpty()) << "without an address";
}

TEST(AddressTest, AThousandAddressesAreDescribed) {
  std::string dump;
  for (int i = 0; i < 1001; ++i) dump += AddressMessage("10.0." + std::to_string(i / 250) + "." + std::to_string(i % 250), 8);
  auto const addresses = AddressesIn(dump, OneLink());
  EXPECT_EQ(addresses.fAll.size(), 1000u);
  EXPECT_EQ(addresses.fWhyNotAll->fReason, "the kernel lists 1001 IP addresses; the first 1000 are described");
  EXPECT_EQ(AddressesIn(End(), OneLink()).fWhyNotAll->fReason, "the kernel lists no IP address");
}

TEST(AddressTest, MasksAreThoseOfThePrefix) {
  EXPECT_EQ(MaskOf(0), "0.0.0.0");
  EXPECT_EQ(MaskOf(1), "128.0.0.0");
  EXPECT_EQ(MaskOf(25), "255.255.255.128");
  EXPECT_EQ(MaskOf(32), "255.255.255.255");
}

TEST(AddressTest, OtherSizesAreNotAddresses) {
  EXPECT_EQ(*IpText("\x7f\0\0\1"s), "127.0.0.1");
  EXPECT_EQ(IpText("abc").Why().fReason, "an IP address of 3 bytes");
  EXPECT_EQ(IpText("").Why().fCode, "not-given");
}

}  // namespace
}  // namespace NQRVZEP20
