// SPDX-License-Identifier: Apache-2.0

// The namespace that the provider fills, read as a front end reads it.

#include "providers/network/NetworkNamespace.h"

#include "TNamespaceProviderManager.h"
#include "TOSSpecific.h"
#include "tests/Machines.h"
#include "tests/providers/network/InstancesText.h"
#include "tests/providers/network/NetlinkBytes.h"

#include <linux/if_link.h>
#include <linux/rtnetlink.h>
#include <sched.h>
#include <sys/mount.h>
#include <nlohmann/json.hpp>

#include <set>

namespace NQRVZEP20 {
namespace {

using testing::Contains;
using testing::HasSubstr;
using testing::Not;

boost::shared_ptr<TMemoryNamespace> Filled(std::string const& root) {
  TEnvironmentGuard const name("ZEP_HOST_NAME", "db1");
  auto ns = NewNamespace();
  FillNetworkNamespace(*ns, TMachineFiles(root));
  return ns;
}

// ---- Recorded machines ----

TEST(NetworkNamespaceTest, ARecordedMachineHasTheseInstances) {
  TRecordedMachine const machine("network");
  EXPECT_EQ(InstancesText(*Filled(machine.Root())), ReadFile(TestDataPath("network/network.txt")));
}

TEST(NetworkNamespaceTest, WithoutAnswersSysfsGivesItsValues) {
  TRecordedMachine const machine("network");
  std::filesystem::remove_all(machine.Root() + "/zep-answers");
  EXPECT_EQ(InstancesText(*Filled(machine.Root())), ReadFile(TestDataPath("network/network-sysfs.txt")));
}

TEST(NetworkNamespaceTest, ADegradedBondIsRecognised) {
  TRecordedMachine const machine("degraded");
  std::string const text = InstancesText(*Filled(machine.Root()));
  EXPECT_THAT(text, HasSubstr("RedundancyStatus = 4"));
  EXPECT_THAT(text, HasSubstr("MIIStatus = down\n  LinkFailures = 1\n"));
}

TEST(NetworkNamespaceTest, AMachineWithoutAnythingHasReasons) {
  TTempDir const empty;
  std::string const text = InstancesText(*Filled(empty.Path()));
  std::string const none = "/zep-answers/netlink/links does not exist; and /sys/class/net lists no interface";
  for (char const* cls : {"CIM_EthernetPort", "CIM_NetworkPort", "ZEP_NetworkInterface", "ZEP_Bond", "ZEP_Bridge",
                          "ZEP_VLANEndpoint", "ZEP_InterfaceStatistics"})
    EXPECT_THAT(text, HasSubstr(cls + (": " + none) + "\n"));
  EXPECT_THAT(text, HasSubstr("ZEP_IPProtocolEndpoint: /zep-answers/netlink/addresses does not exist\n"));
  EXPECT_THAT(text, HasSubstr("ZEP_NextHopIPRoute: /zep-answers/netlink/routes does not exist\n"));
  EXPECT_THAT(text, HasSubstr("CIM_RemoteServiceAccessPoint: /etc/resolv.conf does not exist\n"));
}

// ---- Hostile answers ----

class HostileAnswersTest : public testing::Test {
protected:
  void WriteAnswer(std::string const& name, std::string const& bytes) {
    std::string const path = fDir.Path("zep-answers/" + name);
    std::filesystem::create_directories(std::filesystem::path(path).parent_path());
    WriteFile(path, bytes);
  }

  TTempDir fDir;
};

TEST_F(HostileAnswersTest, NamesAreTextsAndNothingElse) {
  ifinfomsg header = {};
  header.ifi_index = 2;
  std::string const name = "\x1b[2J\"a\\<b>\xff";
  WriteAnswer("netlink/links", Message(RTM_NEWLINK, BytesOf(header) + TextAttribute(IFLA_IFNAME, name) +
                                                        TextAttribute(IFLA_PARENT_DEV_NAME, "../../etc/passwd") +
                                                        NumberAttribute(IFLA_MASTER, 2u) + NumberAttribute(IFLA_LINK, 2u) +
                                                        Attribute(IFLA_LINKINFO, TextAttribute(IFLA_INFO_KIND, "bond"))) +
                                   End());
  std::string const text = InstancesText(*Filled(fDir.Path()));
  EXPECT_THAT(text, HasSubstr("  ElementName = " + name + "\n"));
  EXPECT_THAT(text, HasSubstr("  OtherIdentifyingInfo = { ../../etc/passwd }\n"));
  EXPECT_THAT(text, HasSubstr("  MasterInterface = " + name + "\n")) << "its own master";
}

TEST_F(HostileAnswersTest, EveryLengthOfTheAnswersFillsANamespace) {
  TRecordedMachine const machine("network");
  for (char const* answer : {"netlink/links", "netlink/addresses", "netlink/routes", "ethtool/eth1/linksettings"}) {
    std::string const whole = ReadFile(machine.Root() + "/zep-answers/" + answer);
    ASSERT_FALSE(whole.empty());
    for (std::size_t i = 0; i < 40; ++i) {
      WriteAnswer("netlink/links", ReadFile(machine.Root() + "/zep-answers/netlink/links"));
      WriteAnswer(answer, whole.substr(0, whole.size() * i / 40));
      EXPECT_EQ(All(*Filled(fDir.Path())->GetClass("CIM_ComputerSystem", kNone), &ICIMClass::EnumerateInstances).size(), 1u);
    }
  }
}

// ---- A network namespace of the test's own ----

class LiveNetworkTest : public testing::Test {
protected:
  static void Run(std::string const& command) { EXPECT_EQ(std::system(command.c_str()), 0) << command; }

  static bool Try(std::string const& command) { return std::system((command + " 2>/dev/null").c_str()) == 0; }

  static nlohmann::json Json(std::string const& command) {
    TTempDir const dir;
    Run(command + " > " + dir.Path("out"));
    return nlohmann::json::parse(ReadFile(dir.Path("out")));
  }

  // A network and a mount namespace whose sysfs describes it.
  static bool IsAlone() {
    return ::unshare(CLONE_NEWNET | CLONE_NEWNS) == 0 && ::mount("none", "/", nullptr, MS_REC | MS_PRIVATE, nullptr) == 0 &&
           ::mount("sysfs", "/sys", "sysfs", 0, nullptr) == 0;
  }

  static void MakeNetwork() {
    Run("ip link set lo up");
    Run("ip link add v0 address 02:00:00:00:00:01 mtu 1400 type veth peer name v1");
    Run("ip link set v0 alias 'left side'");
    Run("ip link add br0 type bridge forward_delay 400");
    Run("ip link set v1 master br0");
    Run("ip link set v0 up && ip link set v1 up && ip link set br0 up");
    Run("ip addr add 192.0.2.1/24 broadcast 192.0.2.255 dev v0");
    Run("ip addr add 2001:db8::1/64 dev v0 nodad");
    Run("ip addr add 198.51.100.7/32 dev lo");
    Run("ip route add default via 192.0.2.254 metric 50");
    Run("ip route add blackhole 203.0.113.0/24");
    fHasVlan = Try("ip link add link v0 name v0.5 type vlan id 5");
    fHasBond = Try("ip link add bond7 type bond mode active-backup miimon 50");
  }

  static std::string TextOf(ICIMInstance const& instance, std::string const& property) {
    TCIMValue const value = instance.GetProperty(property, kNone)->GetValue(kNone);
    return value.IsNull() ? "NULL" : value.ToString();
  }

  static boost::shared_ptr<ICIMInstance> Find(ICIMNamespace const& ns, std::string const& className, std::string const& property,
                                              std::string const& value) {
    for (auto const& instance : All(*ns.GetClass(className, kNone), &ICIMClass::EnumerateInstances))
      if (TextOf(*instance, property) == value) return instance;
    return nullptr;
  }

  static std::string TextOf(nlohmann::json const& object, char const* name) {
    if (!object.contains(name)) return "NULL";
    return object[name].is_string() ? object[name].get<std::string>() : object[name].dump();
  }

  static std::string WithoutColons(std::string text) {
    text.erase(std::remove(text.begin(), text.end(), ':'), text.end());
    return text.find_first_not_of('0') == std::string::npos ? "NULL" : text;
  }

  static inline bool fHasVlan = false, fHasBond = false;
};

std::string Lower(std::string text) {
  for (char& c : text) c = static_cast<char>(std::tolower(c));
  return text;
}

TEST_F(LiveNetworkTest, EveryFactOfIpIsThere) {
  NEEDS(IsAlone(), "only root may make a network namespace");
  MakeNetwork();
  auto const ns = Filled("/");

  nlohmann::json const links = Json("ip -j -d link");
  EXPECT_GE(links.size(), 4u);
  for (auto const& link : links) {
    auto const instance = Find(*ns, "ZEP_NetworkInterface", "Name", link["ifname"]);
    ASSERT_TRUE(instance) << link;
    SCOPED_TRACE(link["ifname"]);
    EXPECT_EQ(TextOf(*instance, "InterfaceIndex"), TextOf(link, "ifindex"));
    EXPECT_EQ(TextOf(*instance, "MTU"), TextOf(link, "mtu"));
    EXPECT_EQ(TextOf(*instance, "OperationalState"), Lower(TextOf(link, "operstate")));
    EXPECT_EQ(TextOf(*instance, "QueueDiscipline"), TextOf(link, "qdisc"));
    EXPECT_EQ(TextOf(*instance, "LinkMode"), Lower(TextOf(link, "linkmode")));
    EXPECT_EQ(TextOf(*instance, "LinkType"), TextOf(link, "link_type"));
    EXPECT_EQ(TextOf(*instance, "TransmitQueueLength"), TextOf(link, "txqlen"));
    EXPECT_EQ(TextOf(*instance, "TransmitQueues"), TextOf(link, "num_tx_queues"));
    EXPECT_EQ(TextOf(*instance, "ReceiveQueues"), TextOf(link, "num_rx_queues"));
    EXPECT_EQ(TextOf(*instance, "Promiscuity"), TextOf(link, "promiscuity"));
    EXPECT_EQ(TextOf(*instance, "Alias"), TextOf(link, "ifalias"));
    EXPECT_EQ(TextOf(*instance, "MasterInterface"), TextOf(link, "master"));
    EXPECT_EQ(TextOf(*instance, "LowerInterface"), TextOf(link, "link"));
    EXPECT_EQ(TextOf(*instance, "MACAddress"), WithoutColons(TextOf(link, "address")));
    EXPECT_EQ(TextOf(*instance, "BroadcastAddress"), WithoutColons(TextOf(link, "broadcast")));
    EXPECT_EQ(TextOf(*instance, "Kind"), link.contains("linkinfo") ? TextOf(link["linkinfo"], "info_kind") : "NULL");
    for (auto const& flag : link["flags"])
      if (flag != "NO-CARRIER") {
        EXPECT_THAT(TextOf(*instance, "Flags"), HasSubstr(flag.get<std::string>()));
      }
  }

  int addresses = 0;
  for (auto const& link : Json("ip -j addr"))
    for (auto const& address : link["addr_info"]) {
      std::string const name = TextOf(link, "ifname") + " " + TextOf(address, "local") + "/" + TextOf(address, "prefixlen");
      auto const instance = Find(*ns, "ZEP_IPProtocolEndpoint", "Name", name);
      ASSERT_TRUE(instance) << name;
      EXPECT_EQ(TextOf(*instance, "Scope"), TextOf(address, "scope")) << name;
      EXPECT_EQ(TextOf(*instance, "BroadcastAddress"), TextOf(address, "broadcast")) << name;
      EXPECT_EQ(TextOf(*instance, "Label"), TextOf(address, "label")) << name;
      ++addresses;
    }
  EXPECT_GE(addresses, 5);

  int routes = 0;
  for (char const* family : {"-4", "-6"})
    for (auto const& route : Json(std::string("ip -j -d ") + family + " route")) {
      std::string const destination = TextOf(route, "dst");
      SCOPED_TRACE(route);
      bool isFound = false;
      for (auto const& instance : All(*ns->GetClass("ZEP_NextHopIPRoute", kNone), &ICIMClass::EnumerateInstances)) {
        std::string const address = TextOf(*instance, "DestinationAddress");
        if (destination == "default" ? address != (family[1] == '4' ? "0.0.0.0" : "::") : destination.rfind(address, 0) != 0)
          continue;
        if (TextOf(*instance, "InterfaceName") != TextOf(route, "dev")) continue;
        isFound = true;
        EXPECT_EQ(TextOf(*instance, "Gateway"), TextOf(route, "gateway"));
        EXPECT_EQ(TextOf(*instance, "Protocol"), TextOf(route, "protocol"));
        EXPECT_EQ(TextOf(*instance, "RouteType"), TextOf(route, "type"));
        EXPECT_EQ(TextOf(*instance, "Metric"), route.contains("metric") ? TextOf(route, "metric") : "0");
        EXPECT_EQ(TextOf(*instance, "PreferredSource"), TextOf(route, "prefsrc"));
      }
      EXPECT_TRUE(isFound);
      ++routes;
    }
  EXPECT_GE(routes, 4);
}

TEST_F(LiveNetworkTest, VirtualInterfacesHaveTheirFacts) {
  NEEDS(IsAlone(), "only root may make a network namespace");
  MakeNetwork();
  auto const ns = Filled("/");
  EXPECT_EQ(TextOf(*Find(*ns, "ZEP_Bridge", "Name", "br0"), "ForwardDelay"), "400");
  EXPECT_EQ(TextOf(*Find(*ns, "ZEP_Bridge", "Name", "br0"), "NumPorts"), "1");
  EXPECT_EQ(TextOf(*Find(*ns, "ZEP_BridgePort", "Name", "v1"), "BridgeName"), "br0");
  if (fHasVlan) {
    EXPECT_EQ(TextOf(*Find(*ns, "ZEP_VLANEndpoint", "Name", "v0.5"), "VLANID"), "5");
  }
  if (fHasBond) {
    EXPECT_EQ(TextOf(*Find(*ns, "ZEP_Bond", "ElementName", "bond7"), "MIIMonitoringInterval"), "50");
  }
}

TEST_F(LiveNetworkTest, WithTheSysfsOfAnotherNamespaceNoPortIsInvented) {
  NEEDS(::unshare(CLONE_NEWNET) == 0, "only root may make a network namespace");
  Run("ip link add eth0 index 77 type veth peer name v1 index 78");
  auto const ns = Filled("/");
  EXPECT_FALSE(Find(*ns, "CIM_NetworkPort", "DeviceID", "eth0"));
  EXPECT_TRUE(Find(*ns, "ZEP_NetworkInterface", "Name", "eth0"));
}

// ---- The plug-in ----

TEST(NetworkPlugInTest, ThePlugInRegistersItself) {
  ASSERT_THAT(TOSSpecific::FindNSPs(), Contains("Network"));
  TOSSpecific::LoadNSPLibrary("Network");
  auto const provider = TNamespaceProviderManager::GetInstance()->GetNamespaceProvider("Network");
  EXPECT_EQ(provider->GetName(kNone), "Network");
  EXPECT_EQ(provider->GetNamespace(kNone)->GetName(kNone), "root/zep/network");
}

}  // namespace
}  // namespace NQRVZEP20
