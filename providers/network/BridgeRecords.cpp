// SPDX-License-Identifier: Apache-2.0
#include "BridgeRecords.h"

#include "BondRecords.h"

#include <iterator>

namespace NQRVZEP20 {

namespace {

constexpr TValueName kBridgeTypes[] = {{"2", "Transparent-only"}};
constexpr TValueName kAddressTypes[] = {{"5", "MAC + Spanning Tree Priority"}};
constexpr TValueName kInterfaceType[] = {{"209", "Transparent Bridge"}};
constexpr char const* kCentiseconds = "second * 10^-2";

// By number, as the kernel defines them.
constexpr char const* kSpanningTree[] = {"off", "kernel", "user"};
constexpr char const* kPortStates[] = {"disabled", "listening", "learning", "forwarding", "blocking"};

// Settings that few bridges change.
constexpr char const* kOtherSettings[] = {
    "group_addr",        "group_fwd_mask",         "no_linklocal_learn",      "vlan_stats_enabled", "multicast_router",
    "multicast_querier", "multicast_igmp_version", "multicast_mld_version",   "nf_call_iptables",   "nf_call_ip6tables",
    "nf_call_arptables", "topology_change",        "topology_change_detected"};
constexpr char const* kOtherPortSettings[] = {"bpdu_guard",    "root_block",      "multicast_fast_leave", "multicast_flood",
                                              "unicast_flood", "broadcast_flood", "multicast_router",     "proxyarp",
                                              "proxyarp_wifi", "neigh_suppress",  "group_fwd_mask"};

template <std::size_t N>
TFinding<std::string> WordOf(TFinding<std::uint32_t> const& number, char const* const (&words)[N]) {
  return number.Then([&](std::uint32_t state) -> TFinding<std::string> {
    if (state < N) return std::string(words[state]);
    return TMissing{kMissingUnexpected, std::to_string(state) + " is not a known state"};
  });
}

TFinding<bool> IsOn(TFinding<std::uint32_t> const& number) {
  return number.Then([](std::uint32_t flag) { return flag != 0; });
}

TFinding<std::string> VlanProtocolFrom(std::string const& number) {
  if (number == "0x8100") return std::string("802.1Q");
  if (number == "0x88a8") return std::string("802.1ad");
  return TMissing{kMissingUnexpected, "\"" + number + "\" is not a VLAN protocol"};
}

TFinding<std::uint16_t> Own(std::uint16_t number) { return number; }

}  // namespace

bool IsBridge(TLink const& link) { return link.IsKind("bridge"); }

TRecord BridgeRecord(TMachineFiles const& files, TLink const& bridge, TLinks const& links, TComputerSystem const& system) {
  TLinkFiles const of(files, bridge);
  auto const number = [&](std::string const& name) { return of.Number<std::uint32_t>("bridge/" + name); };
  TRecord record("ZEP_Bridge", "sysfs", "CIM_SwitchService");
  system.AddHostedKeys(record, bridge.fName);
  record.AddOwn("ElementName", bridge.fName);
  record.Add("BridgeAddress", of.Line("bridge/bridge_id"));
  record.Add("BridgeAddressType", Own(5)).Names(kAddressTypes);
  record.Add("BridgeType", TFinding<std::uint8_t>(std::uint8_t(2))).Names(kBridgeTypes);
  record.Add("NumPorts", Own(static_cast<std::uint16_t>(MembersOf(bridge, links).size())));
  record.Add("SpanningTree", WordOf(number("stp_state"), kSpanningTree));
  record.Add("Priority", number("priority"));
  record.Add("DesignatedRoot", of.Line("bridge/root_id"));
  record.Add("RootPathCost", number("root_path_cost"));
  record.Add("RootPort", number("root_port"));
  record.Add("ForwardDelay", number("forward_delay")).Unit(kCentiseconds);
  record.Add("HelloTime", number("hello_time")).Unit(kCentiseconds);
  record.Add("MaxAge", number("max_age")).Unit(kCentiseconds);
  record.Add("AgingTime", number("ageing_time")).Unit(kCentiseconds);
  record.Add("VLANFiltering", IsOn(number("vlan_filtering")));
  record.Add("VLANProtocol", of.Line("bridge/vlan_protocol").Then(VlanProtocolFrom));
  record.Add("DefaultPVID", number("default_pvid"));
  record.Add("MulticastSnooping", IsOn(number("multicast_snooping")));
  record.Add("OtherSettings", of.Settings("bridge", kOtherSettings));
  return record;
}

TRecord BridgePortRecord(TMachineFiles const& files, TLink const& member, TLinks const& links, TComputerSystem const& system) {
  TLinkFiles const of(files, member);
  auto const number = [&](std::string const& name) { return of.Number<std::uint32_t>("brport/" + name); };
  TRecord record("ZEP_BridgePort", "sysfs", "CIM_SwitchPort");
  system.AddHostedKeys(record, member.fName);
  record.AddOwn("ElementName", member.fName);
  record.Add("ProtocolIFType", Own(209)).Names(kInterfaceType);
  record.Add("PortNumber", of.Number<std::uint16_t>("brport/port_no"));
  record.Add("BridgeName", links.NameOf(member.fMaster));
  record.Add("PortState", WordOf(number("state"), kPortStates));
  record.Add("PathCost", number("path_cost"));
  record.Add("Priority", number("priority"));
  record.Add("DesignatedRoot", of.Line("brport/designated_root"));
  record.Add("DesignatedBridge", of.Line("brport/designated_bridge"));
  record.Add("DesignatedCost", number("designated_cost"));
  record.Add("Hairpin", IsOn(number("hairpin_mode")));
  record.Add("Learning", IsOn(number("learning")));
  record.Add("Isolated", IsOn(number("isolated")));
  record.Add("OtherSettings", of.Settings("brport", kOtherPortSettings));
  return record;
}

}  // namespace NQRVZEP20
