// SPDX-License-Identifier: Apache-2.0

// The discovery of the web proxy with real DHCP servers, in namespaces of their own (run-in-netns.sh). Where the length of a wait
// does not matter, WpadProbe waits a twentieth of it and prints "(up to 6 s)".

#include "tests/system/wpad/WpadBed.h"

#include <gtest/gtest.h>

#include <algorithm>

namespace NQRVZEP20 {
namespace {

TLines operator+(TLines left, TLines const& right) {
  left.insert(left.end(), right.begin(), right.end());
  return left;
}

// The output of WpadProbe.
struct TDiscovery {
  std::string fUrl;
  long fMilliseconds = -1;
  TLines fLog;
};

TLines const kStops = {"[Debug] SpawnProcess: process ps"};
TLines const kUp = {"[Debug] the interface status is UP!"};
TLines const kDown = {"[Debug] the interface status is DOWN!"};
TLines const kAsks4 = {"[Debug] IP v4 Format!"};
TLines const kAsks6 = {"[Debug] IP v6 Format!"};
TLines const kWaits = {"[Debug] (up to 6 s)"};
TLines const kUnheard = kWaits + TLines{"[Debug] receiving  DHCP message error!"};
TLines const kUnsent = TLines{"[Debug] sending DHCP message error!"} + kUnheard;
TLines const kShows = {"[Debug] SpawnProcess: process ifconfig"};
TLines const kFound = {"[Debug] Get  DHCP wpadurl is =http://wpad.test/wpad.dat"};
TLines const kFoundBy6 = {"[Debug] Get  DHCP wpadurl via IPV6 is =http://wpad.test/wpad.dat"};

TLines Thrice(TLines const& lines) { return lines + lines + lines; }

class WpadTest : public TWpadBed {
protected:
  static TDiscovery DiscoveryIn(std::string const& output) {
    TLines const lines = LinesOf(output);
    TDiscovery discovery;
    if (lines.size() < 2) {
      ADD_FAILURE() << output;
      return discovery;
    }
    return {lines[0], std::stol(lines[1]), TLines(lines.begin() + 2, lines.end())};
  }

  TDiscovery Discover(std::string const& settings, std::string const& before = "") {
    return DiscoveryIn(Inside(settings, before + "\n$PROBE start"));
  }

  // The same, with short waits.
  TDiscovery DiscoverInHurry(std::string const& settings, std::string const& before = "") {
    return Discover("ZEP_WPAD_HURRY=1 " + settings, before);
  }
};

std::string const kRecorded = "WPAD_SERVER=bytes WPAD_REPLY=" + TestDataPath("wpad/reply-kea.hex") + " ";

// ---- Replies ----

TEST_F(WpadTest, UrlInTheReplyIsReturned) {
  TDiscovery const found = Discover("");
  EXPECT_EQ(found.fUrl, "http://wpad.test/wpad.dat");
  EXPECT_EQ(found.fLog, kStops + kUp + kAsks4 + kFound);
}

// The shortest of several runs, because other tests may run at the same time. The server replies within two milliseconds.
TEST_F(WpadTest, DiscoveryEndsWhenTheReplyArrives) {
  TLines const lines = LinesOf(Inside("", "for _ in 1 2 3 4 5; do $PROBE start | sed -n 2p; done"));
  ASSERT_EQ(lines.size(), 5u);
  long least = 1000000;
  for (std::string const& line : lines) least = std::min(least, std::stol(line));
  RecordProperty("milliseconds", static_cast<int>(least));
  EXPECT_LE(least, kIsSanitized ? 1000 : 50);
}

TEST_F(WpadTest, LongUrlIsReturnedInFull) {
  std::string const url = "http://wpad.test/" + std::string(190, 'x');
  EXPECT_EQ(Discover("WPAD_URL=" + url).fUrl, url);
}

TEST_F(WpadTest, ReplyWithoutTheOptionEndsTheQueryWithoutAUrl) {
  TDiscovery const found = DiscoverInHurry("WPAD_URL=-");
  EXPECT_EQ(found.fUrl, "");
  EXPECT_EQ(found.fLog, kStops + kUp + kAsks4 + kWaits + kShows);
}

TEST_F(WpadTest, EveryAttemptSendsTheMessageAndTheThirdMayBeAnswered) {
  TLines const lines = LinesOf(Inside("ZEP_WPAD_HURRY=1 WPAD_SKIP=2 " + kRecorded,
                                      "tr -d : < /sys/class/net/eth0/address; $PROBE start; cat $ZEP_WPAD_LOG"));
  TLines const log = kStops + kUp + kAsks4 + kUnheard + kUnheard + kWaits + kFound;
  ASSERT_EQ(lines.size(), 3 + log.size() + 4);
  EXPECT_EQ(lines[1], "http://wpad.test/wpad.dat");
  EXPECT_EQ(TLines(lines.begin() + 3, lines.end() - 4), log);
  std::string const message =
      "01010600bf07000000000000"
      "0a4d0002" +
      std::string(2 * 12, '0') + lines[0] + std::string(2 * 202, '0') +
      "63825363"
      "350108"
      "3701fc"
      "ff" +
      std::string(2 * 1225, '0');
  EXPECT_EQ(TLines(lines.end() - 4, lines.end()), (TLines{"listening", message, message, message}));
}

TEST_F(WpadTest, AnyPacketIsAReply) {
  struct {
    char const* fWhat;
    std::string fReply;
    std::string fUrl;
  } const rows[] = {
      {"nothing", "", ""},
      {"one byte", "fc", ""},
      {"no options", std::string(2 * 240, '0'), ""},
      {"no reply at all, but with the option", std::string(2 * 240, 'f') + "fc0175", "u"},
      {"a longer message than is taken", std::string(2 * 240, '0') + "fc03", std::string(3, '\0')},
      {"all ones", [] { return std::string(2 * 1472, 'f'); }(), ""},
      {"a length after the end", std::string(2 * 240, '0') + "01ff" + std::string(2 * 255, '1') + "fcff61",
       "a" + std::string(254, '\0')},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fWhat);
    std::string const output = Inside("ZEP_WPAD_HURRY=1 " + ReplyFile(row.fReply), "$PROBE start");
    EXPECT_EQ(output.substr(0, output.find('\n')), row.fUrl);
    std::size_t const end = output.find("[Debug] receiving  DHCP message error!");
    EXPECT_EQ(end, std::string::npos) << output;
  }
}

TEST_F(WpadTest, ReplyToTheSendersPortIsNotReceived) {
  std::string const output = Inside("ZEP_WPAD_HURRY=1 WPAD_SERVER=dnsmasq", "$PROBE start; grep -c DHCPACK $ZEP_WPAD_LOG");
  TLines lines = LinesOf(output);
  EXPECT_EQ(lines.back(), "3");
  EXPECT_EQ(lines.front(), "");
  EXPECT_EQ(TLines(lines.begin() + 2, lines.end() - 1), kStops + kUp + kAsks4 + Thrice(kUnheard) + kShows);
}

// ---- No reply ----

TEST_F(WpadTest, UnansweredQueryTakesThreeAttemptsOfSixSeconds) {
  TDiscovery const found = Discover("WPAD_SERVER=none");
  EXPECT_EQ(found.fUrl, "");
  EXPECT_EQ(found.fLog, kStops + kUp + kAsks4 + Thrice({"[Debug] receiving  DHCP message error!"}) + kShows);
  EXPECT_GE(found.fMilliseconds, 17900);
  EXPECT_LE(found.fMilliseconds, 23500);  // the kernel rounds each wait up; a fourth would make it 24 s
}

TEST_F(WpadTest, NothingIsSentWithoutARoute) {
  EXPECT_EQ(DiscoverInHurry("WPAD_ROUTE=none").fLog, kStops + kUp + kAsks4 + Thrice(kUnsent) + kShows);
}

TEST_F(WpadTest, PortInUseIsRetriedAndThenNoReplyIsReceived) {
  TDiscovery const found = DiscoverInHurry("", R"sh(
    python3 -c 'import socket, time; s = socket.socket(socket.AF_INET, socket.SOCK_DGRAM); s.bind(("", 68)); time.sleep(60)' &
    for _ in $(seq 100); do [ -n "$(ss -Hlnu 'sport = :68')" ] && break; sleep 0.05; done)sh");
  EXPECT_EQ(found.fUrl, "");
  TLines const refused = {"[Debug] bind to DHCP_CLIENT_PORT failed!"};
  TLines retries;
  for (int retry = 1; retry <= 10; ++retry) retries = retries + refused + TLines{"[Debug] (up to 3 s)"};
  EXPECT_EQ(found.fLog, kStops + kUp + retries + refused + kAsks4 + Thrice(kUnheard) + kShows);
}

// ---- Interfaces ----

TEST_F(WpadTest, SecondInterfaceIsQueriedWhenTheFirstGetsNoReply) {
  TDiscovery const found = DiscoverInHurry("WPAD_FIRST=up WPAD_NAME=eth1");
  EXPECT_EQ(found.fUrl, "http://wpad.test/wpad.dat");
  EXPECT_EQ(found.fLog, kStops + kUp + kAsks4 + Thrice(kUnheard) + kUp + kAsks4 + kWaits + kFound);
}

TEST_F(WpadTest, InterfaceThatIsDownIsQueried) {
  TDiscovery const found = DiscoverInHurry("WPAD_FIRST=down WPAD_NAME=eth1");
  EXPECT_EQ(found.fUrl, "http://wpad.test/wpad.dat");
  EXPECT_EQ(found.fLog, kStops + kDown + kAsks4 + Thrice(kUnheard) + kUp + kAsks4 + kWaits + kFound);
}

TEST_F(WpadTest, PromiscuousInterfaceIsLogged) {
  EXPECT_EQ(Discover("", "ip link set eth0 promisc on").fLog,
            kStops + TLines{"[Debug] the interface is PROMISC!"} + kUp + kAsks4 + kFound);
}

TEST_F(WpadTest, InterfaceWithSeveralAddressesIsQueriedOnce) {
  EXPECT_EQ(DiscoverInHurry("WPAD_SERVER=none", "ip addr add 10.88.0.2/24 dev eth0").fLog,
            kStops + kUp + kAsks4 + Thrice(kUnheard) + kShows);
}

TEST_F(WpadTest, InterfaceWithAnotherNameIsNotQueried) {
  TDiscovery const found = Discover("WPAD_NAME=net0");
  EXPECT_EQ(found.fUrl, "");
  EXPECT_EQ(found.fLog, kStops + kShows);
}

TEST_F(WpadTest, InterfaceThatCannotBeReadIsSkipped) {
  struct {
    char const* fSettings;
    TLines fLog;
  } const rows[] = {
      {"ZEP_WPAD_FAIL=0x8912", kStops + TLines{"[Debug] cpm: send ioctl error !"} + kShows},
      {"ZEP_WPAD_FAIL=0x8913", kStops + TLines{"[Debug] cpm: ioctl device eth0"} + kShows},
      {"ZEP_WPAD_FAIL=0x8915", kStops + kUp + TLines{"[Debug] cpm: ioctl device eth0"} + kShows},
      {"ZEP_WPAD_FAIL=0x8927", kStops + kUp + TLines{"[Debug] cpm: ioctl device eth0"} + kShows},
      {"ZEP_WPAD_FAIL=0x8915 WPAD_FIRST=up WPAD_NAME=eth1",
       kStops + kUp + TLines{"[Debug] cpm: ioctl device eth0"} + kUp + kAsks4 + kFound},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fSettings);
    EXPECT_EQ(Discover(row.fSettings).fLog, row.fLog);
  }
}

TEST_F(WpadTest, NothingIsThrownWhenNoSocketCanBeOpened) {
  if (kIsSanitized) GTEST_SKIP() << "a sanitizer needs additional descriptors";
  TLines const noPipe = {"[Debug] ERROR: SpawnProcess - pipe call failed!"};
  TDiscovery const found = Discover("ZEP_WPAD_NO_DESCRIPTORS=1");
  EXPECT_EQ(found.fUrl, "");
  EXPECT_EQ(found.fLog, kStops + noPipe + TLines{"[Debug] cpm: send socket error!"} + kShows + noPipe);
}

// ---- The query with an IPv6 address ----

TEST_F(WpadTest, IPV6AddressIsFoundInTheOutputOfBusybox) {
  TDiscovery const found = DiscoverInHurry("WPAD_SERVER=none WPAD_IFCONFIG=busybox");
  EXPECT_EQ(found.fUrl, "");
  EXPECT_EQ(found.fLog, kStops + kUp + kAsks4 + Thrice(kUnheard) + kShows + kAsks6 + Thrice(kUnheard));
}

TEST_F(WpadTest, IPV6QueryHasNoAddressAndTheHardwareAddressReadLast) {
  TLines const lines = LinesOf(Inside("ZEP_WPAD_HURRY=1 WPAD_IFCONFIG=busybox WPAD_SKIP=3 " + kRecorded,
                                      "tr -d : < /sys/class/net/eth0/address; $PROBE start; cat $ZEP_WPAD_LOG"));
  TLines const log = kStops + kUp + kAsks4 + Thrice(kUnheard) + kShows + kAsks6 + kWaits + kFoundBy6;
  ASSERT_EQ(lines.size(), 3 + log.size() + 5);
  EXPECT_EQ(lines[1], "http://wpad.test/wpad.dat");
  EXPECT_EQ(TLines(lines.begin() + 3, lines.end() - 5), log);
  EXPECT_EQ(lines.back().substr(0, 68), "01010600bf07000000000000" + std::string(2 * 16, '0') + lines[0]);
  EXPECT_EQ(lines.back().size(), 2 * 1472u);
}

// The server does not serve any of the queried interfaces. Without an address in the message it replies to the sender.
TEST_F(WpadTest, IPV6QueryIsAnsweredByARealServer) {
  TDiscovery const found = DiscoverInHurry("WPAD_IFCONFIG=busybox WPAD_FIRST=up WPAD_NAME=net1");
  EXPECT_EQ(found.fUrl, "http://wpad.test/wpad.dat");
  EXPECT_EQ(found.fLog, kStops + kUp + kAsks4 + Thrice(kUnheard) + kShows + kAsks6 + kWaits + kFoundBy6);
}

TEST_F(WpadTest, IPV6QueryNeedsNoInterface) {
  TDiscovery const found = DiscoverInHurry("WPAD_IFCONFIG=busybox WPAD_NAME=net0 WPAD_ROUTE=none");
  EXPECT_EQ(found.fLog, kStops + kShows + kAsks6 + TLines{"[Debug] invalid MAC Format!"} + Thrice(kUnsent));
}

TEST_F(WpadTest, AddressEndsAtItsPrefixLengthOrABlank) {
  for (std::string const shown : {"x inet6 addr: fd77::2/64 Scope:Link", "inet6 addr: fd77::2", "inet6 addr: fd77::2 /64",
                                  "inet6 addr: fd77::2/64\ninet6 addr: rubbish", "inet6 fe80::9\ninet6 addr: fd77::2\n"}) {
    SCOPED_TRACE(shown);
    WriteFile(fDir.Path("shown"), shown);
    TDiscovery const found = DiscoverInHurry("WPAD_URL=-", "mkdir /dev/shm/bin; printf '#!/bin/sh\\ncat " + fDir.Path("shown") +
                                                               "' > /dev/shm/bin/ifconfig; chmod +x /dev/shm/bin/ifconfig\n"
                                                               "PATH=/dev/shm/bin:$PATH");
    EXPECT_EQ(found.fLog, kStops + kUp + kAsks4 + kWaits + kShows + kAsks6 + kWaits);
  }
}

// ---- DHCP clients ----

TEST_F(WpadTest, DhcpClientsAreEnded) {
  TLines const lines = LinesOf(Inside("WPAD_DHCLIENT=1", R"sh(
    mkdir /dev/shm/bin; for name in xdhclient6 dhclien; do cp "$(command -v sleep)" /dev/shm/bin/$name; /dev/shm/bin/$name 99 & done
    names() { ps -e -o comm= | grep -E 'dhclien' | sort | xargs; }
    until [ "$(names | wc -w)" = 3 ]; do sleep 0.02; done
    names; $PROBE stop; for _ in $(seq 100); do [ "$(names)" = dhclien ] && break; sleep 0.1; done; names; ls /dev/nul)sh"));
  EXPECT_EQ(lines.size(), 6u);
  EXPECT_EQ(lines[0], "dhclien dhclient xdhclient6");
  EXPECT_EQ(TLines(lines.begin() + 3, lines.end()), (kStops + TLines{"dhclien", "/dev/nul"}));
}

TEST_F(WpadTest, OutputOfKillGoesToAFile) {
  EXPECT_NE(Inside("", R"sh(
    mkdir /dev/shm/bin; printf '#!/bin/sh\necho "   99999 ? 00:00:00 dhclient"' > /dev/shm/bin/ps; chmod +x /dev/shm/bin/ps
    PATH=/dev/shm/bin:$PATH $PROBE stop; cat /dev/nul)sh")
                .find("No such process"),
            std::string::npos);
}

TEST_F(WpadTest, NothingIsEndedWhenThatFileCannotBeCreated) {
  TLines const lines = LinesOf(
      Inside("WPAD_DHCLIENT=1",
             "mkdir /dev/nul; until ps -e | grep -q dhclient; do sleep 0.02; done; $PROBE stop; ps -e -o comm= | grep dhclient"));
  EXPECT_EQ(lines.back(), "dhclient");
}

TEST_F(WpadTest, LineWithoutANumberEndsNothing) {
  TLines const lines = LinesOf(Inside("", R"sh(
    mkdir /dev/shm/bin; printf '#!/bin/sh\necho "dhclient; touch /dev/shm/run"; echo; echo "  ? dhclient"' > /dev/shm/bin/ps
    chmod +x /dev/shm/bin/ps; PATH=/dev/shm/bin:$PATH $PROBE stop; ls /dev/shm; ls /dev/nul 2>&1 | grep -c 'No such file')sh"));
  EXPECT_EQ(TLines(lines.end() - 2, lines.end()), (TLines{"bin", "1"}));
}

TEST_F(WpadTest, MissingProgramsEndNothingAndShowNoAddress) {
  TDiscovery const found = Discover("WPAD_DHCLIENT=1 WPAD_URL=-", "PATH=/nowhere");
  EXPECT_EQ(found.fLog, kStops + kUp + kAsks4 + kShows);
}

}  // namespace
}  // namespace NQRVZEP20
