// SPDX-License-Identifier: Apache-2.0
#include "providers/network/NetlinkDump.h"

#include "providers/network/Link.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <linux/rtnetlink.h>
#include <sys/resource.h>
#include <sys/socket.h>

#include <algorithm>

namespace NQRVZEP20 {
namespace {

TEST(NetlinkDumpTest, TheKernelListsTheLoopbackInterface) {
  auto const dump = NetlinkDump(RTM_GETLINK, AF_UNSPEC);
  ASSERT_TRUE(dump) << dump.Why().fReason;
  auto const links = LinksIn(*dump).fAll;
  EXPECT_TRUE(std::any_of(links.begin(), links.end(), [](TLink const& link) { return link.fName == "lo"; }));
}

TEST(NetlinkDumpTest, ReadingStopsAtTheLimit) {
  auto const whole = NetlinkDump(RTM_GETLINK, AF_UNSPEC), part = NetlinkDump(RTM_GETLINK, AF_UNSPEC, 1);
  ASSERT_TRUE(whole && part);
  EXPECT_LT(part->size(), whole->size());
  EXPECT_GE(LinksIn(*part).fAll.size(), 1u) << "a datagram is read to its end";
}

TEST(NetlinkDumpTest, ARefusedRequestIsAReason) {
  auto const dump = NetlinkDump(RTM_MAX + 100, AF_UNSPEC);
  ASSERT_FALSE(dump);
  EXPECT_EQ(dump.Why().fCode, "unreadable");
  EXPECT_THAT(dump.Why().fReason, testing::StartsWith("netlink: the kernel answers: "));
}

TEST(NetlinkDumpTest, ARefusedSocketIsAReason) {
  rlimit limit;
  ASSERT_EQ(::getrlimit(RLIMIT_NOFILE, &limit), 0);
  rlimit const none{0, limit.rlim_max};
  ASSERT_EQ(::setrlimit(RLIMIT_NOFILE, &none), 0);
  auto const dump = NetlinkDump(RTM_GETLINK, AF_UNSPEC);
  ASSERT_EQ(::setrlimit(RLIMIT_NOFILE, &limit), 0);
  ASSERT_FALSE(dump);
  EXPECT_EQ(dump.Why().fReason, "netlink: the kernel refuses the socket: Too many open files");
}

}  // namespace
}  // namespace NQRVZEP20
