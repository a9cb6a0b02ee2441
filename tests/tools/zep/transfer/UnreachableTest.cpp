// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/transfer/Unreachable.h"

#include "core/Handles.h"
#include "tests/Support.h"
#include "tools/zep/processes/Interrupts.h"

#include <arpa/inet.h>
#include <gmock/gmock.h>
#include <netinet/in.h>
#include <sched.h>
#include <signal.h>
#include <sys/mount.h>
#include <sys/socket.h>
#include <sys/time.h>

#include <unistd.h>

#include <chrono>
#include <cstdlib>
#include <iostream>

namespace NQRVZEP20::zep {
namespace {

// Reserves a TCP port of loopback as long as the object exists.
class TPort {
public:
  TPort() : fSocket(::socket(AF_INET, SOCK_STREAM, 0)) {
    sockaddr_in name{};
    name.sin_family = AF_INET;
    name.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    socklen_t size = sizeof name;
    auto* const address = reinterpret_cast<sockaddr*>(&name);
    EXPECT_EQ(::bind(fSocket.get(), address, size), 0);
    EXPECT_EQ(::getsockname(fSocket.get(), address, &size), 0);
    fNumber = std::to_string(ntohs(name.sin_port));
  }

  void Listen() { EXPECT_EQ(::listen(fSocket.get(), 1), 0); }

  // From now on no connection is refused, and none gets an answer: the only one that may wait is there already.
  void Fill() {
    EXPECT_EQ(::listen(fSocket.get(), 0), 0);
    sockaddr_storage name{};
    socklen_t size = sizeof name;
    auto* const address = reinterpret_cast<sockaddr*>(&name);
    EXPECT_EQ(::getsockname(fSocket.get(), address, &size), 0);
    fWaiting = TUniqueFd(::socket(AF_INET, SOCK_STREAM, 0));
    EXPECT_EQ(::connect(fWaiting.get(), address, size), 0);
  }
  std::string const& Number() const { return fNumber; }

private:
  TUniqueFd fSocket, fWaiting;
  std::string fNumber;
};

TEST(UnreachableTest, ARefusedPortAndAnUnknownHostHaveDifferentReasons) {
  TPort const port;
  EXPECT_EQ(WhyUnreachable("127.0.0.1", port.Number(), 3),
            "127.0.0.1 refuses connections to port " + port.Number() + "; is the server running, and the port right?");
  EXPECT_THAT(WhyUnreachable("no-such-host.invalid", "21", 3), testing::StartsWith("the host name no-such-host.invalid "));
}

TEST(UnreachableTest, AHostThatAnswersIsNotUnreachable) {
  TPort port;
  port.Listen();
  EXPECT_EQ(WhyUnreachable("127.0.0.1", port.Number(), 3), "");
}

// Lets the process do that every 100 ms from now on; a system call that waits is interrupted.
void Repeat(void (*handler)(int)) {
  struct sigaction action {};
  action.sa_handler = handler;
  ::sigaction(SIGALRM, &action, nullptr);
  itimerval const tenthOfASecond{{0, 100000}, {0, 100000}};
  ::setitimer(ITIMER_REAL, &tenthOfASecond, nullptr);
}

void StopRepeating() {
  itimerval const never{};
  ::setitimer(ITIMER_REAL, &never, nullptr);
  ::signal(SIGALRM, SIG_DFL);
}

TEST(UnreachableTest, ASignalDoesNotShortenTheWait) {
  TPort port;
  port.Fill();
  Repeat([](int) {});
  auto const start = std::chrono::steady_clock::now();
  std::string const why = WhyUnreachable("127.0.0.1", port.Number(), 1);
  double const seconds = std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
  StopRepeating();
  EXPECT_EQ(why, "127.0.0.1 does not answer at port " + port.Number() + "; is it on, and does a firewall let this port through?");
  EXPECT_GT(seconds, 0.95);
}

TEST(UnreachableTest, AnInterruptEndsTheWaitAndIsTheReason) {
  TPort port;
  port.Fill();
  EXPECT_EXIT(
      {
        TInterruptGuard const guard;
        Repeat([](int) { ::raise(SIGTERM); });
        std::cerr << WhyUnreachable("127.0.0.1", port.Number(), 600);
      },
      testing::KilledBySignal(SIGTERM), "^interrupted$");
}

// For use in a child: in a network of its own, in which the only name server does not answer. False when that is not possible.
bool HaveSilentNameServer(TTempDir const& dir, int socket) {
  WriteFile(dir.Path("resolv.conf"), "nameserver 127.0.0.1\noptions timeout:30 attempts:5\n");
  WriteFile(dir.Path("nsswitch.conf"), "hosts: dns\n");
  if (::mount(nullptr, "/", nullptr, MS_REC | MS_PRIVATE, nullptr) != 0) return false;
  for (char const* const name : {"resolv.conf", "nsswitch.conf"})
    if (::mount(dir.Path(name).c_str(), (std::string("/etc/") + name).c_str(), nullptr, MS_BIND, nullptr) != 0) return false;
  sockaddr_in name{};
  name.sin_family = AF_INET;
  name.sin_port = htons(53);
  name.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
  return std::system("ip link set lo up") == 0 && ::bind(socket, reinterpret_cast<sockaddr*>(&name), sizeof name) == 0;
}

TEST(UnreachableTest, AnInterruptEndsTheLookUpOfAName) {
  NEEDS(::geteuid() == 0 && std::system("command -v ip > /dev/null") == 0, "root, and ip (package iproute2)");
  TTempDir const dir;
  EXPECT_EXIT(
      {
        if (::unshare(CLONE_NEWNET | CLONE_NEWNS) != 0) ::_exit(1);
        TUniqueFd const server(::socket(AF_INET, SOCK_DGRAM, 0));
        if (!HaveSilentNameServer(dir, server.get())) ::_exit(2);
        TInterruptGuard const guard;
        Repeat([](int) { ::raise(SIGTERM); });
        auto const start = std::chrono::steady_clock::now();
        std::string const why = WhyUnreachable("host.example", "21", 3);
        bool const isSoon = std::chrono::steady_clock::now() - start < std::chrono::seconds(60);
        std::cerr << why << (isSoon ? " soon" : " late");
      },
      testing::KilledBySignal(SIGTERM), "^interrupted soon$");
}

}  // namespace
}  // namespace NQRVZEP20::zep
