// SPDX-License-Identifier: Apache-2.0

// Tests each step of the discovery separately. A step that uses a network runs on a thread in an empty network namespace.
// The steps that end processes, wpadPreconfig and StartWpad, are tested in tests/system/wpad only.

#include "AutoProxyDiscovery.h"

#include "tests/Support.h"

#include <arpa/inet.h>
#include <fcntl.h>
#include <netinet/in.h>
#include <sched.h>
#include <sys/resource.h>
#include <sys/socket.h>
#include <unistd.h>

#include <gtest/gtest.h>

#include <array>
#include <chrono>
#include <cstdlib>
#include <cstring>
#include <memory>

namespace {

int gPauses = -1;  // the pauses counted so far; -1: sleep really sleeps
unsigned gPauseSeconds = 0;
int gPausesUntilPortIsFree = 0;
int gPortHolder = -1;

}  // namespace

// The library calls this function instead of that of the C library, so that a test counts pauses instead of waiting.
extern "C" ZEP_EXPORT unsigned sleep(unsigned seconds) {
  if (gPauses < 0) {
    timespec const time{static_cast<time_t>(seconds), 0};
    return ::nanosleep(&time, nullptr) == 0 ? 0 : seconds;
  }
  gPauseSeconds += seconds;
  if (++gPauses == gPausesUntilPortIsFree) ::close(gPortHolder);
  return 0;
}

namespace NQRVZEP20 {
namespace {

using TEntries = std::vector<std::string>;

struct TFree {
  void operator()(unsigned char* bytes) const { std::free(bytes); }
};
using TMessage = std::unique_ptr<unsigned char, TFree>;

// Runs the step on a new thread and returns the lines that it logged.
TEntries LogOf(std::function<void()> const& step) {
  TEntries entries;
  OnNewThread([&] {
    TLogCapture const log;
    step();
    entries = log.Entries();
  });
  return entries;
}

std::uint32_t Quad(unsigned char a, unsigned char b, unsigned char c, unsigned char d) {
  unsigned char const bytes[] = {a, b, c, d};
  std::uint32_t address;
  std::memcpy(&address, bytes, sizeof address);
  return address;
}

// ---- Memory and message ----

TEST(AutoProxyDiscoveryTest, AllocatesZeroFilledMemory) {
  for (unsigned long size : {1ul, 1472ul, 100000ul}) {
    SCOPED_TRACE(size);
    TMessage const bytes(static_cast<unsigned char*>(AutoProxyDiscovery::xzalloc(size)));
    ASSERT_NE(bytes, nullptr);
    EXPECT_EQ(std::string(bytes.get(), bytes.get() + size), std::string(size, '\0'));
  }
}

TEST(AutoProxyDiscoveryTest, WithoutMemoryXzallocReturnsNull) {
  if (kIsSanitized) GTEST_SKIP() << "not with a sanitizer, whose allocator ends the program";
  EXPECT_EQ(AutoProxyDiscovery::xzalloc(1ul << 62), nullptr);
}

TEST(AutoProxyDiscoveryTest, MessageHasItsFixedBytes) {
  std::string expected(1472, '\0');
  expected.replace(0, 8, std::string("\x01\x01\x06\x00\xbf\x07\x00\x00", 8));
  expected.replace(12, 4, "\x0a\x4d\x01\x02");
  expected.replace(28, 6, "\x02\xab\xcd\xef\x10\xff");
  expected.replace(236, 11, "\x63\x82\x53\x63\x35\x01\x08\x37\x01\xfc\xff");

  unsigned char* received = nullptr;
  TMessage const message(AutoProxyDiscovery::make_message("10.77.1.2", "02:ab:CD:ef:10:ff", received));
  ASSERT_EQ(message.get(), received);
  EXPECT_EQ(std::string(received, received + 1472), expected);

  TMessage const second(AutoProxyDiscovery::make_message("10.77.1.2", "02:ab:CD:ef:10:ff", &received));
  ASSERT_EQ(second.get(), received);
  EXPECT_NE(second.get(), message.get());
  EXPECT_EQ(std::string(received, received + 1472), expected);

  TMessage const third(AutoProxyDiscovery::make_message("10.77.1.2", "02:ab:CD:ef:10:ff"));
  EXPECT_EQ(std::string(third.get(), third.get() + 1472), expected);
}

TEST(AutoProxyDiscoveryTest, MalformedAddressesAreZeroInTheMessage) {
  TMessage message;
  EXPECT_EQ(LogOf([&] { message.reset(AutoProxyDiscovery::make_message("10.77", "02:ab")); }),
            (TEntries{"[Debug] IP v4 Format!", "[Debug] invalid IP Format : 10.77", "[Debug] invalid MAC Format!"}));
  EXPECT_EQ(std::string(message.get() + 12, message.get() + 34), std::string(22, '\0'));
  EXPECT_EQ(message.get()[240], 0x35);
}

// ---- Addresses ----

TEST(AutoProxyDiscoveryTest, ReadsIPV4Addresses) {
  struct {
    std::string fText;
    std::uint32_t fAddress;
    bool fIsValid;
  } const rows[] = {
      {"10.77.0.2", Quad(10, 77, 0, 2), true},
      {"0.0.0.0", 0, true},
      {"255.255.255.255", Quad(255, 255, 255, 255), true},
      {"", 0, false},
      {"10.77.0", 0, false},
      {"10.77.0.2.3", 0, false},
      {"10.77.0.256", 0, false},
      {"10.77.0.-1", 0, false},
      {"10.77..2", 0, false},
      {"10.77.0.2 ", 0, false},
      {" 10.77.0.2", 0, false},
      {"10.77.0.2\n", 0, false},
      {"10.77.0.x", 0, false},
      {"10.77.0.0x2", 0, false},
      {"168624130", 0, false},
      {"host", 0, false},
      {"::1", 0, false},
      {std::string("10.77.0.2\0x", 11), 0, false},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fText);
    TEntries const complaint = {"[Debug] invalid IP Format : " + std::string(row.fText.c_str())};
    EXPECT_EQ(LogOf([&] { EXPECT_EQ(AutoProxyDiscovery::GetIPV4Ciaddr(row.fText), row.fAddress); }),
              row.fIsValid ? TEntries{} : complaint);
  }
}

TEST(AutoProxyDiscoveryTest, AnIPV6AddressGivesZeroUnlessItIsAMappedIPV4Address) {
  struct {
    std::string fText;
    std::uint32_t fAddress;
    bool fIsValid;
  } const rows[] = {
      {"::ffff:10.77.0.2", Quad(10, 77, 0, 2), true},
      {"::ffff:0a4d:0002", Quad(10, 77, 0, 2), true},
      {"::FFFF:10.77.0.2", Quad(10, 77, 0, 2), true},
      {"fe80::1", 0, true},
      {"fd77::2", 0, true},
      {"::1", 0, true},
      {"::", 0, true},
      {"::10.77.0.2", 0, true},
      {"2001:db8:1:2:3:4:5:6", 0, true},
      {"", 0, false},
      {"fe80::1/64", 0, false},
      {"fe80:::1", 0, false},
      {"1:2:3:4:5:6:7", 0, false},
      {"12345::1", 0, false},
      {"g::1", 0, false},
      {"10.77.0.2", 0, false},
      {"::ffff:10.77.0.256", 0, false},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fText);
    EXPECT_EQ(LogOf([&] { EXPECT_EQ(AutoProxyDiscovery::GetIPV6Ciaddr(row.fText), row.fAddress); }),
              row.fIsValid ? TEntries{} : TEntries{"[Debug] invalid IP Format : " + row.fText});
  }
}

TEST(AutoProxyDiscoveryTest, AnAddressWithAColonIsReadAsIPV6) {
  struct {
    std::string fText;
    std::uint32_t fAddress;
    TEntries fLog;
  } const rows[] = {
      {"10.77.0.2", Quad(10, 77, 0, 2), {"[Debug] IP v4 Format!"}},
      {"fe80::1", 0, {"[Debug] IP v6 Format!"}},
      {"::ffff:10.77.0.2", Quad(10, 77, 0, 2), {"[Debug] IP v6 Format!"}},
      {"10.77.0", 0, {"[Debug] IP v4 Format!", "[Debug] invalid IP Format : 10.77.0"}},
      {"", 0, {"[Debug] IP v4 Format!", "[Debug] invalid IP Format : "}},
      {"nothing", 0, {"[Debug] IP v4 Format!", "[Debug] invalid IP Format : nothing"}},
      {"fe80::x", 0, {"[Debug] IP v6 Format!", "[Debug] invalid IP Format : fe80::x"}},
      {"10.77.0.2:80", 0, {"[Debug] IP v6 Format!", "[Debug] invalid IP Format : 10.77.0.2:80"}},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fText);
    EXPECT_EQ(LogOf([&] { EXPECT_EQ(AutoProxyDiscovery::GetCiaddr(row.fText), row.fAddress); }), row.fLog);
  }
}

TEST(AutoProxyDiscoveryTest, ReadsHardwareAddresses) {
  std::array<unsigned char, 8> const untouched = {9, 9, 9, 9, 9, 9, 9, 9};
  struct {
    std::string fText;
    std::array<unsigned char, 8> fBytes;  // two more than an address has
  } const rows[] = {
      {"00:11:22:33:44:55", {0x00, 0x11, 0x22, 0x33, 0x44, 0x55, 9, 9}},
      {"09:af:AF:f0:0F:ff", {0x09, 0xaf, 0xaf, 0xf0, 0x0f, 0xff, 9, 9}},
      {"", untouched},
      {"00:11:22:33:44", untouched},
      {"00:11:22:33:44:5", untouched},
      {"00:11:22:33:44:555", untouched},
      {"00:11:22:33:44:55:66", untouched},
      {"00-11-22-33-44-55", untouched},
      {"001122334455", untouched},
      {"0:011:22:33:44:55", untouched},
      {"00:11:22:33:44:5g", untouched},
      {"00:11:22:33:44: 5", untouched},
      {"00:11:22:33:44:+5", untouched},
      {"00:11:22:33:44:0x", untouched},
      {" 0:11:22:33:44:55", untouched},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fText);
    std::array<unsigned char, 8> bytes = untouched;
    EXPECT_EQ(LogOf([&] { AutoProxyDiscovery::GetChaddr(row.fText, bytes.data()); }),
              row.fBytes == untouched ? TEntries{"[Debug] invalid MAC Format!"} : TEntries{});
    EXPECT_EQ(bytes, row.fBytes);
  }
}

// ---- Sockets ----

// While an object exists, no new descriptor can be opened.
class TNoMoreDescriptors {
public:
  TNoMoreDescriptors() {
    ::getrlimit(RLIMIT_NOFILE, &fOld);
    rlimit const none{0, fOld.rlim_max};
    ::setrlimit(RLIMIT_NOFILE, &none);
  }
  ~TNoMoreDescriptors() { ::setrlimit(RLIMIT_NOFILE, &fOld); }

private:
  rlimit fOld;
};

TEST(AutoProxyDiscoveryTest, TheSendSocketIsAUdpSocketThatMayBroadcast) {
  int socket = -1;
  EXPECT_EQ(LogOf([&] { socket = AutoProxyDiscovery::open_send_socket(); }), TEntries{});
  ASSERT_GE(socket, 0);
  int value = 0;
  socklen_t size = sizeof value;
  EXPECT_EQ(::getsockopt(socket, SOL_SOCKET, SO_TYPE, &value, &size), 0);
  EXPECT_EQ(value, SOCK_DGRAM);
  EXPECT_EQ(::getsockopt(socket, SOL_SOCKET, SO_BROADCAST, &value, &size), 0);
  EXPECT_NE(value, 0);
  ::close(socket);
}

TEST(AutoProxyDiscoveryTest, WithoutDescriptorsOpeningASocketFailsWithALogLine) {
  if (kIsSanitized) GTEST_SKIP() << "a sanitizer needs additional descriptors";
  int sender = 0, receiver = 0;
  EXPECT_EQ(LogOf([&] {
              TNoMoreDescriptors const none;
              sender = AutoProxyDiscovery::open_send_socket();
              receiver = AutoProxyDiscovery::open_recv_socket(nullptr);
            }),
            (TEntries{"[Debug] open_send_socket failed!", "[Debug] setup socket failed!"}));
  EXPECT_EQ(sender, -1);
  EXPECT_EQ(receiver, -1);
}

TEST(AutoProxyDiscoveryTest, TheTimeoutAppliesToReceiving) {
  int const socket = ::socket(AF_INET, SOCK_DGRAM, 0);
  EXPECT_EQ(AutoProxyDiscovery::readable_timeo(socket, 6), 0);
  timeval limit{};
  socklen_t size = sizeof limit;
  EXPECT_EQ(::getsockopt(socket, SOL_SOCKET, SO_RCVTIMEO, &limit, &size), 0);
  EXPECT_EQ(limit.tv_sec, 6);
  EXPECT_EQ(limit.tv_usec, 0);

  EXPECT_EQ(AutoProxyDiscovery::readable_timeo(socket, 1), 0);
  auto const start = std::chrono::steady_clock::now();
  char byte;
  EXPECT_EQ(::recv(socket, &byte, 1, 0), -1);
  EXPECT_EQ(errno, EAGAIN);
  std::chrono::duration<double> const waited = std::chrono::steady_clock::now() - start;
  EXPECT_GE(waited.count(), 0.95);
  EXPECT_LT(waited.count(), 5);
  ::close(socket);
  EXPECT_EQ(AutoProxyDiscovery::readable_timeo(socket, 6), -1);
}

// Runs the test in a network namespace that has only a loopback interface.
void InOwnNetwork(std::function<void()> const& test) {
  OnNewThread([&] {
    if (::unshare(CLONE_NEWNET) != 0) FAIL() << "no network namespace can be created: " << std::strerror(errno);
    test();
  });
}

sockaddr_in NameOf(int socket) {
  sockaddr_in name{};
  socklen_t size = sizeof name;
  EXPECT_EQ(::getsockname(socket, reinterpret_cast<sockaddr*>(&name), &size), 0);
  return name;
}

int SocketAt(int port) {
  int const socket = ::socket(AF_INET, SOCK_DGRAM, 0);
  sockaddr_in name{};
  name.sin_family = AF_INET;
  name.sin_port = htons(static_cast<std::uint16_t>(port));
  EXPECT_EQ(::bind(socket, reinterpret_cast<sockaddr*>(&name), sizeof name), 0);
  return socket;
}

class PortTest : public testing::Test {
protected:
  void SetUp() override { NEEDS(::geteuid() == 0, "only root makes a network"); }
  ~PortTest() override { gPauses = -1; }

  // Opens the receiving socket while port 68 is taken, and counts its pauses instead of waiting.
  static int OpenCountingPauses(int pausesUntilPortIsFree) {
    gPortHolder = SocketAt(68);
    gPauses = 0, gPauseSeconds = 0, gPausesUntilPortIsFree = pausesUntilPortIsFree;
    char name[] = "eth0";
    return AutoProxyDiscovery::open_recv_socket(name);
  }
};

TEST_F(PortTest, TheReceiveSocketListensOnPort68OfEveryAddress) {
  InOwnNetwork([] {
    TLogCapture const log;
    int const socket = AutoProxyDiscovery::open_recv_socket(nullptr);
    ASSERT_GE(socket, 0);
    EXPECT_EQ(ntohs(NameOf(socket).sin_port), 68);
    EXPECT_EQ(NameOf(socket).sin_addr.s_addr, INADDR_ANY);
    EXPECT_EQ(log.Entries(), TEntries{});
    ::close(socket);
  });
}

TEST_F(PortTest, ATakenPortIsTriedElevenTimesAndThenTheSocketHasNoPort) {
  InOwnNetwork([] {
    TLogCapture const log;
    int const socket = OpenCountingPauses(0);
    EXPECT_GE(socket, 0);
    EXPECT_EQ(NameOf(socket).sin_port, 0);
    EXPECT_EQ(log.Entries(), TEntries(11, "[Debug] bind to DHCP_CLIENT_PORT failed!"));
    EXPECT_EQ(gPauses, 10);
    EXPECT_EQ(gPauseSeconds, 30u);
    ::close(socket);
    ::close(gPortHolder);
  });
}

TEST_F(PortTest, APortThatBecomesFreeIsTaken) {
  for (int pauses : {1, 10})
    InOwnNetwork([pauses] {
      SCOPED_TRACE(pauses);
      TLogCapture const log;
      int const socket = OpenCountingPauses(pauses);
      EXPECT_EQ(ntohs(NameOf(socket).sin_port), 68);
      EXPECT_EQ(log.Entries(), TEntries(static_cast<std::size_t>(pauses), "[Debug] bind to DHCP_CLIENT_PORT failed!"));
      EXPECT_EQ(gPauses, pauses);
      ::close(socket);
    });
}

TEST_F(PortTest, ARetryWaitsThreeSeconds) {
  InOwnNetwork([] {
    gPortHolder = SocketAt(68);
    auto const start = std::chrono::steady_clock::now();
    std::thread release([] {
      std::this_thread::sleep_for(std::chrono::seconds(1));
      ::close(gPortHolder);
    });
    int const socket = AutoProxyDiscovery::open_recv_socket(nullptr);
    std::chrono::duration<double> const waited = std::chrono::steady_clock::now() - start;
    EXPECT_GE(waited.count(), 2.9);
    EXPECT_LT(waited.count(), 5.9);  // two pauses take 6 seconds
    EXPECT_EQ(ntohs(NameOf(socket).sin_port), 68);
    release.join();
    ::close(socket);
  });
}

TEST_F(PortTest, APacketIsBroadcastToPort67) {
  NEEDS(std::system("command -v ip > /dev/null") == 0, "no ip (package iproute2)");
  InOwnNetwork([] {
    ASSERT_EQ(std::system("ip link set lo up && ip route add 255.255.255.255 dev lo"), 0);
    int const server = SocketAt(67);
    int const one = 1;
    ::setsockopt(server, IPPROTO_IP, IP_PKTINFO, &one, sizeof one);
    AutoProxyDiscovery::readable_timeo(server, 2);

    unsigned char const bytes[] = {1, 2, 3, 4, 5};
    int const sender = AutoProxyDiscovery::open_send_socket();
    EXPECT_EQ(AutoProxyDiscovery::send_packet(sender, bytes, 5), 5);

    unsigned char got[16];
    char control[128];
    iovec piece{got, sizeof got};
    msghdr packet{};
    packet.msg_iov = &piece, packet.msg_iovlen = 1, packet.msg_control = control, packet.msg_controllen = sizeof control;
    ASSERT_EQ(::recvmsg(server, &packet, 0), 5);
    EXPECT_EQ(std::memcmp(got, bytes, 5), 0);
    in_pktinfo info{};
    ASSERT_NE(CMSG_FIRSTHDR(&packet), nullptr);
    std::memcpy(&info, CMSG_DATA(CMSG_FIRSTHDR(&packet)), sizeof info);
    EXPECT_EQ(info.ipi_addr.s_addr, INADDR_BROADCAST);
    ::close(sender);
    ::close(server);
  });
}

TEST_F(PortTest, AFailureToSendIsReturned) {
  InOwnNetwork([] {
    unsigned char const byte = 1;
    int const sender = AutoProxyDiscovery::open_send_socket();
    EXPECT_EQ(AutoProxyDiscovery::send_packet(sender, &byte, 1), -1);
    EXPECT_EQ(errno, ENETUNREACH);
    ::close(sender);
    EXPECT_EQ(AutoProxyDiscovery::send_packet(sender, &byte, 1), -1);
  });
}

}  // namespace
}  // namespace NQRVZEP20
