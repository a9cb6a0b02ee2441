// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/transfer/Unreachable.h"

#include "tools/zep/processes/Descriptor.h"

#include <arpa/inet.h>
#include <gmock/gmock.h>
#include <netinet/in.h>
#include <sys/socket.h>

namespace NQRVZEP20::zep {
namespace {

// A TCP port of loopback that nobody else has as long as it lives.
class TPort {
public:
  TPort() : fSocket(::socket(AF_INET, SOCK_STREAM, 0)) {
    sockaddr_in name{};
    name.sin_family = AF_INET;
    name.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    socklen_t size = sizeof name;
    auto* const address = reinterpret_cast<sockaddr*>(&name);
    EXPECT_EQ(::bind(fSocket.Get(), address, size), 0);
    EXPECT_EQ(::getsockname(fSocket.Get(), address, &size), 0);
    fNumber = std::to_string(ntohs(name.sin_port));
  }

  void Listen() { EXPECT_EQ(::listen(fSocket.Get(), 1), 0); }
  std::string const& Number() const { return fNumber; }

private:
  TDescriptor fSocket;
  std::string fNumber;
};

TEST(UnreachableTest, ARefusedPortIsToldFromAHostThatIsUnknown) {
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

}  // namespace
}  // namespace NQRVZEP20::zep
