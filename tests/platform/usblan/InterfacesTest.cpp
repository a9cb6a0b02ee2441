// SPDX-License-Identifier: Apache-2.0

// Which interfaces lead to a controller, and whether they reach it.

#include "platform/usblan/Interfaces.h"

#include "tests/Support.h"

#include <gmock/gmock.h>

namespace usblan {
namespace {

using NQRVZEP20::TTempDir;
using testing::ElementsAre;
using testing::IsEmpty;

constexpr std::uint32_t Ip(int a, int b, int c, int d) {
  return static_cast<std::uint32_t>(((a * 256u + static_cast<unsigned>(b)) * 256u + static_cast<unsigned>(c)) * 256u +
                                    static_cast<unsigned>(d));
}
constexpr std::uint32_t k24 = 0xFFFFFF00, k16 = 0xFFFF0000;

TEST(UsbLanAddressTest, EachNodeHasANetworkOfItsOwn) {
  EXPECT_EQ(ControllerAddress(0), Ip(169, 254, 95, 118));
  EXPECT_EQ(OwnAddress(0), Ip(169, 254, 95, 1));
  EXPECT_EQ(ControllerAddress(15), Ip(169, 254, 110, 118));
  EXPECT_EQ(OwnAddress(15), Ip(169, 254, 110, 1));
}

TEST(UsbLanAddressTest, AnInterfaceReachesTheControllerOfItsNetworkWhileItIsUp) {
  struct TRow {
    char const* fWhat;
    TInterface fInterface;
    int fNode;
    bool fReaches;
  };
  TRow const rows[] = {
      {"no address", {"usb0", true}, 0, false},
      {"the address of the node", {"usb0", true, {{Ip(169, 254, 95, 1), k24}}}, 0, true},
      {"another of its network", {"usb0", true, {{Ip(169, 254, 95, 77), k24}}}, 0, true},
      {"link-local as a whole", {"usb0", true, {{Ip(169, 254, 3, 4), k16}}}, 0, true},
      {"down", {"usb0", false, {{Ip(169, 254, 95, 1), k24}}}, 0, false},
      {"another node's network", {"usb0", true, {{Ip(169, 254, 96, 1), k24}}}, 0, false},
      {"that node", {"usb0", true, {{Ip(169, 254, 96, 1), k24}}}, 1, true},
      {"the controller's own address", {"usb0", true, {{Ip(169, 254, 95, 118), k24}}}, 0, false},
      {"a second address", {"usb0", true, {{Ip(10, 0, 0, 1), k24}, {Ip(169, 254, 95, 1), k24}}}, 0, true},
      {"a host address", {"usb0", true, {{Ip(169, 254, 95, 1), 0xFFFFFFFF}}}, 0, false},
      {"a network of everything", {"usb0", true, {{Ip(10, 0, 0, 1), 0}}}, 0, false},
  };
  for (TRow const& row : rows) EXPECT_EQ(Reaches(row.fInterface, row.fNode), row.fReaches) << row.fWhat;
}

// The kernel's files in /sys/class/net.
class ControllerInterfacesTest : public testing::Test {
protected:
  void AddInterface(std::string const& name, std::string const& driver) {
    std::filesystem::create_directories(fDir.Path(name + "/device"));
    std::filesystem::create_directory_symlink("../../../bus/usb/drivers/" + driver, fDir.Path(name + "/device/driver"));
  }

  std::vector<std::string> Found(std::vector<TInterface> const& all, std::string const& named = "") {
    std::vector<std::string> names;
    for (TInterface const& interface : ControllerInterfaces(all, named, fDir.Path())) names.push_back(interface.fName);
    return names;
  }

  TTempDir fDir;
};

TEST_F(ControllerInterfacesTest, UsbNetworkInterfacesLeadToAController) {
  AddInterface("enp1s0", "e1000e");
  AddInterface("usb0", "cdc_ether");
  AddInterface("usb1", "rndis_host");
  AddInterface("usb2", "cdc_subset");
  AddInterface("wlan0", "cdc_ether_of_another_kind");
  std::filesystem::create_directories(fDir.Path("dummy0"));  // no device
  EXPECT_THAT(Found({{"dummy0"}, {"enp1s0"}, {"lo"}, {"usb0"}, {"usb1"}, {"usb2"}, {"wlan0"}}),
              ElementsAre("usb0", "usb1", "usb2"));
  EXPECT_THAT(Found({}), IsEmpty());
}

TEST_F(ControllerInterfacesTest, OneWithAnAddressOfAnotherNetworkLeadsElsewhere) {
  for (char const* name : {"usb0", "usb1", "usb2"}) AddInterface(name, "cdc_ether");
  EXPECT_THAT(Found({{"usb0", true, {{Ip(192, 168, 42, 3), k24}}},
                     {"usb1", true, {{Ip(169, 254, 7, 8), k16}}},
                     {"usb2", true, {{Ip(169, 254, 7, 9), k16}, {Ip(10, 0, 0, 1), k24}}}}),
              ElementsAre("usb1"));
}

TEST_F(ControllerInterfacesTest, NamedOnesCountInTheirOrder) {
  AddInterface("usb0", "cdc_ether");
  std::vector<TInterface> const all = {{"usb0"}, {"veth0", true, {{Ip(10, 0, 0, 1), k24}}}, {"veth1"}};
  EXPECT_THAT(Found(all, "veth1 veth0"), ElementsAre("veth1", "veth0"));
  EXPECT_THAT(Found(all, "  veth1   veth0 "), ElementsAre("veth1", "veth0"));
  EXPECT_THAT(Found(all, " "), IsEmpty());
}

TEST_F(ControllerInterfacesTest, ANamedOneThatIsMissingKeepsItsPlace) {
  std::vector<TInterface> const nodes = ControllerInterfaces({{"veth0"}, {"veth1"}}, "absent veth1 gone veth0", fDir.Path());
  ASSERT_EQ(nodes.size(), 4u);
  for (std::size_t node : {0, 2}) EXPECT_FALSE(nodes[node].fIsThere) << node;
  EXPECT_EQ(nodes[1].fName, "veth1");
  EXPECT_TRUE(nodes[1].fIsThere);
  EXPECT_EQ(nodes[3].fName, "veth0");
}

TEST_F(ControllerInterfacesTest, ThereAreNoMoreThan16) {
  std::vector<TInterface> all;
  for (int n = 10; n < 30; ++n) {
    all.push_back({"usb" + std::to_string(n)});
    AddInterface(all.back().fName, "cdc_ether");
  }
  std::vector<std::string> const found = Found(all);
  EXPECT_EQ(found.size(), 16u);
  EXPECT_EQ(found.back(), "usb25");
}

TEST(AllInterfacesTest, LoopbackIsAmongThem) {
  std::vector<TInterface> const all = AllInterfaces();
  auto const isLoopback = [](TInterface const& interface) { return interface.fName == "lo"; };
  EXPECT_EQ(std::count_if(all.begin(), all.end(), isLoopback), 1);
}

}  // namespace
}  // namespace usblan
