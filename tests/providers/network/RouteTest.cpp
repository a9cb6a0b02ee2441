// SPDX-License-Identifier: Apache-2.0
#include "providers/network/Route.h"

#include "tests/providers/network/NetlinkBytes.h"

#include <arpa/inet.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <linux/rtnetlink.h>

namespace NQRVZEP20 {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

TLinks TwoLinks() {
  TLinks links{"rtnetlink", {TLink(), TLink()}, {}};
  links.fAll[0].fName = "eth0";
  links.fAll[0].fIndex = 2u;
  links.fAll[1].fName = "eth1";
  links.fAll[1].fIndex = 3u;
  return links;
}

std::string Ip(std::string const& text) {
  in6_addr bytes = {};
  bool const isIPv6 = text.find(':') != std::string::npos;
  EXPECT_EQ(::inet_pton(isIPv6 ? AF_INET6 : AF_INET, text.c_str(), &bytes), 1) << text;
  return BytesOf(bytes).substr(0, isIPv6 ? 16 : 4);
}

rtmsg Header(sa_family_t family, std::uint8_t prefixLength, std::uint8_t table = RT_TABLE_MAIN) {
  rtmsg header = {};
  header.rtm_family = static_cast<unsigned char>(family);
  header.rtm_dst_len = prefixLength;
  header.rtm_table = table;
  header.rtm_protocol = RTPROT_STATIC;
  header.rtm_type = RTN_UNICAST;
  return header;
}

std::string RouteMessage(rtmsg const& header, std::string const& attributes) {
  return Message(RTM_NEWROUTE, BytesOf(header) + attributes);
}

std::string Over(std::uint32_t index) { return NumberAttribute(RTA_OIF, index); }

std::string Hop(std::uint16_t length, int index, std::string const& attributes) {
  return BytesOf(rtnexthop{length, 0, 0, index}) + attributes;
}

std::vector<std::string> NamesIn(std::string const& dump) {
  std::vector<std::string> names;
  for (TRoute const& route : RoutesIn(dump, TwoLinks()).fAll) names.push_back(route.Name());
  return names;
}

TEST(RouteTest, NamesAreThoseOfDestinationAndNextHop) {
  std::string const gateway = Attribute(RTA_GATEWAY, Ip("192.0.2.1"));
  EXPECT_THAT(
      NamesIn(RouteMessage(Header(AF_INET, 0), gateway + Over(2) + NumberAttribute(RTA_PRIORITY, std::uint32_t(100))) +
              RouteMessage(Header(AF_INET, 24), Attribute(RTA_DST, Ip("192.0.2.0")) + Over(2)) +
              RouteMessage(Header(AF_INET6, 0), Attribute(RTA_GATEWAY, Ip("fe80::1")) + Over(3)) +
              RouteMessage(Header(AF_INET, 8), Attribute(RTA_DST, Ip("10.0.0.0"))) +
              RouteMessage(Header(AF_INET, 16), Attribute(RTA_DST, Ip("172.16.0.0")) + Over(3) +
                                                    Attribute(RTA_VIA, BytesOf(std::uint16_t(AF_INET6)) + Ip("fe80::2"))) +
              End()),
      ElementsAre("0.0.0.0/0 via 192.0.2.1 dev eth0 metric 100", "192.0.2.0/24 dev eth0", "::/0 via fe80::1 dev eth1",
                  "10.0.0.0/8", "172.16.0.0/16 via fe80::2 dev eth1"));
}

TEST(RouteTest, OnlyTheMainTableIsDescribed) {
  EXPECT_THAT(
      NamesIn(RouteMessage(Header(AF_INET, 0, RT_TABLE_LOCAL), Over(2)) +
              RouteMessage(Header(AF_INET, 0), Over(2) + NumberAttribute(RTA_TABLE, std::uint32_t(1000))) +
              RouteMessage(Header(AF_INET, 1, RT_TABLE_COMPAT), Over(2) + NumberAttribute(RTA_TABLE, std::uint32_t(254))) +
              End()),
      ElementsAre("0.0.0.0/1 dev eth0"));
}

TEST(RouteTest, EachNextHopIsARoute) {
  std::string const first = Attribute(RTA_GATEWAY, Ip("192.0.2.1")), second = Attribute(RTA_GATEWAY, Ip("198.51.100.1"));
  auto const namesFor = [&](std::string const& hops) {
    return NamesIn(RouteMessage(Header(AF_INET, 0), Attribute(RTA_MULTIPATH, hops)) + End());
  };
  std::uint16_t const length = sizeof(rtnexthop) + 8;
  EXPECT_THAT(namesFor(Hop(length, 2, first) + Hop(length, 3, second)),
              ElementsAre("0.0.0.0/0 via 192.0.2.1 dev eth0", "0.0.0.0/0 via 198.51.100.1 dev eth1"));
  EXPECT_THAT(namesFor(Hop(length, 2, first) + Hop(0, 3, second)), ElementsAre("0.0.0.0/0 via 192.0.2.1 dev eth0"));
  EXPECT_THAT(namesFor(Hop(length, 2, first) + Hop(7, 3, second)), ElementsAre("0.0.0.0/0 via 192.0.2.1 dev eth0"));
  EXPECT_THAT(namesFor(Hop(length, 2, first) + Hop(500, 3, second)), ElementsAre("0.0.0.0/0 via 192.0.2.1 dev eth0"));
  EXPECT_THAT(namesFor(Hop(length, 2, first).substr(0, 7)), IsEmpty());
  EXPECT_THAT(namesFor(Hop(sizeof(rtnexthop), 2, "")), ElementsAre("0.0.0.0/0 dev eth0"));
  EXPECT_THAT(namesFor(Hop(9, 2, "a")), ElementsAre("0.0.0.0/0 dev eth0")) << "a length that is not a multiple of four";
}

TEST(RouteTest, InvalidRoutesAreLeftOut) {
  EXPECT_EQ(RoutesIn(RouteMessage(Header(AF_INET, 33), Over(2)) + End(), TwoLinks()).fWhyNotAll->fReason,
            "the kernel lists no route");
  EXPECT_THAT(
      NamesIn(RouteMessage(Header(AF_INET, 33), Over(2)) + RouteMessage(Header(AF_INET6, 129), Over(2)) +
              RouteMessage(Header(AF_UNIX, 0), Over(2)) + RouteMessage(Header(AF_INET, 8), Attribute(RTA_DST, Ip("2001:db8::"))) +
              Message(RTM_NEWROUTE, "abc") + End()),
      IsEmpty());
}

TEST(RouteTest, AThousandRoutesAreDescribed) {
  std::string dump;
  for (std::uint32_t i = 0; i < 1500; ++i)
    dump += RouteMessage(Header(AF_INET, 32), Attribute(RTA_DST, BytesOf(htonl(i))) + Over(2));
  auto const all = RoutesIn(dump + End(), TwoLinks());
  EXPECT_EQ(all.fAll.size(), 1000u);
  EXPECT_EQ(all.fWhyNotAll->fReason, "the kernel lists 1500 routes; the first 1000 are described");
  EXPECT_EQ(RoutesIn(dump, TwoLinks()).fWhyNotAll->fReason,
            "the kernel lists more than 1500 routes; the first 1000 are described")
      << "reading stopped before the end";
  EXPECT_EQ(RoutesIn(End(), TwoLinks()).fWhyNotAll->fReason, "the kernel lists no route");
}

}  // namespace
}  // namespace NQRVZEP20
