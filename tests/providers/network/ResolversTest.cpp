// SPDX-License-Identifier: Apache-2.0
#include "providers/network/Resolvers.h"

#include "tests/Support.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

TEST(ResolversTest, LinesAreReadAsTheCLibraryReadsThem) {
  TResolvers const resolvers = ResolversIn(
      "# nameserver 192.0.2.1\n"
      "nameserver 192.0.2.2\n"
      "  nameserver\t2001:db8::2%eth0  # the second one\n"
      "nameserver 192.0.2.2\n"
      "nameserver\n"
      "domain old.example\n"
      "search a.example b.example\n"
      "options ndots:2\n"
      "options rotate timeout:1\n"
      "; the end\n"
      "nameserver 192.0.2.3");
  EXPECT_THAT(resolvers.fServers, ElementsAre("192.0.2.2", "2001:db8::2%eth0", "192.0.2.3"));
  EXPECT_THAT(resolvers.fSearchDomains, ElementsAre("a.example", "b.example"));
  EXPECT_THAT(resolvers.fOptions, ElementsAre("ndots:2", "rotate", "timeout:1"));
}

TEST(ResolversTest, OtherTextsAreIgnored) {
  for (char const* text : {"", "\n\n", "nameserver", "sortlist 1.2.3.4\n", "\xff\xfe\0nameserver 1.2.3.4"})
    EXPECT_THAT(ResolversIn(text).fServers, IsEmpty()) << text;
  std::string many;
  for (int i = 0; i < 200; ++i) many += "nameserver 192.0.2." + std::to_string(i) + "\n";
  EXPECT_EQ(ResolversIn(many).fServers.size(), 100u);
}

class ResolversOfTest : public testing::Test {
protected:
  void Write(std::string const& path, std::string const& text) {
    std::filesystem::create_directories(std::filesystem::path(fDir.Path(path)).parent_path());
    WriteFile(fDir.Path(path), text);
  }

  TTempDir fDir;
  TMachineFiles fFiles{fDir.Path()};
};

TEST_F(ResolversOfTest, BehindSystemdResolvedAreItsOwnServers) {
  Write("etc/resolv.conf", "nameserver 127.0.0.53\nsearch a.example\n");
  EXPECT_THAT(ResolversOf(fFiles)->fServers, ElementsAre("127.0.0.53"));
  Write("run/systemd/resolve/resolv.conf", "nameserver 192.0.2.53\n");
  EXPECT_THAT(ResolversOf(fFiles)->fServers, ElementsAre("192.0.2.53"));
  EXPECT_EQ(ResolversOf(fFiles)->fFile, "/run/systemd/resolve/resolv.conf");
}

TEST_F(ResolversOfTest, AMissingFileIsAReason) {
  EXPECT_EQ(ResolversOf(fFiles).Why().fReason, "/etc/resolv.conf does not exist");
}

TEST(GatewaysTest, EachGatewayIsNamedOnce) {
  TRoutes routes;
  auto const add = [&](char const* gateway, std::uint8_t prefixLength) {
    routes.fAll.emplace_back();
    routes.fAll.back().fGateway = std::string(gateway);
    routes.fAll.back().fPrefixLength = prefixLength;
  };
  add("192.0.2.1", 24);
  add("192.0.2.2", 24);
  add("192.0.2.1", 0);
  routes.fAll.emplace_back();  // without a gateway
  auto const gateways = GatewaysOf(routes);
  ASSERT_EQ(gateways.size(), 2u);
  EXPECT_EQ(gateways[0].fAddress, "192.0.2.1");
  EXPECT_EQ(gateways[0].fKind, TRemoteHost::kDefaultGateway);
  EXPECT_EQ(gateways[1].fKind, TRemoteHost::kGateway);
}

}  // namespace
}  // namespace NQRVZEP20
