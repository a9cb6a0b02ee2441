// SPDX-License-Identifier: Apache-2.0
#include "Link.h"

#include "Limits.h"
#include "NetlinkDump.h"
#include "NetlinkMessages.h"

#include <arpa/inet.h>
#include <linux/if_link.h>
#include <linux/rtnetlink.h>

#include <algorithm>
#include <set>

namespace NQRVZEP20 {

namespace {

TLinkCounters CountersFrom(rtnl_link_stats64 const& of) {
  return {of.rx_packets,       of.tx_packets,        of.rx_bytes,          of.tx_bytes,        of.rx_errors,
          of.tx_errors,        of.rx_dropped,        of.tx_dropped,        of.multicast,       of.collisions,
          of.rx_length_errors, of.rx_over_errors,    of.rx_crc_errors,     of.rx_frame_errors, of.rx_fifo_errors,
          of.rx_missed_errors, of.tx_aborted_errors, of.tx_carrier_errors, of.tx_fifo_errors,  of.tx_heartbeat_errors,
          of.tx_window_errors};
}

// Kernels before 4.9 report one counter less than rtnl_link_stats64 has here, and later ones may report more.
TFinding<TLinkCounters> CountersIn(std::string_view bytes) {
  rtnl_link_stats64 counters = {};
  if (bytes.size() < offsetof(rtnl_link_stats64, rx_compressed)) return TLink::WhyAbsent();
  std::memcpy(&counters, bytes.data(), std::min(bytes.size(), sizeof counters));
  return CountersFrom(counters);
}

std::vector<std::string> OtherNamesIn(std::string_view list) {
  std::vector<std::string> names;
  TNetlinkAttributes::VisitEach(list, [&](unsigned type, std::string_view name) {
    if (type == IFLA_ALT_IFNAME) names.emplace_back(TextIn(name));
  });
  return names;
}

void ReadVlan(TLink& link, TNetlinkAttributes const& data) {
  link.fVlanId = data.Number<std::uint16_t>(IFLA_VLAN_ID);
  link.fVlanProtocol = data.Number<std::uint16_t>(IFLA_VLAN_PROTOCOL).Then([](std::uint16_t big) { return ntohs(big); });
  link.fVlanFlags = data.Number<ifla_vlan_flags>(IFLA_VLAN_FLAGS).Then([](ifla_vlan_flags flags) { return flags.flags; });
}

// An index that IFLA_LINK_NETNSID accompanies is one of another network namespace.
TFinding<std::uint32_t> LowerIn(TNetlinkAttributes const& attributes) {
  if (attributes.Has(IFLA_LINK_NETNSID))
    return TMissing{kMissingNotApplicable, "the interface below is in another network namespace"};
  return attributes.Number<std::uint32_t>(IFLA_LINK);
}

TLink LinkFrom(ifinfomsg const& header, TNetlinkAttributes const& attributes) {
  TNetlinkAttributes const info = attributes.Nested(IFLA_LINKINFO);
  TLink link;
  link.fName = TextIn(attributes.Bytes(IFLA_IFNAME));
  link.fIndex = static_cast<std::uint32_t>(header.ifi_index);
  link.fType = header.ifi_type;
  link.fFlags = header.ifi_flags;
  link.fOperState = attributes.Number<std::uint8_t>(IFLA_OPERSTATE);
  link.fHasCarrier = attributes.Number<std::uint8_t>(IFLA_CARRIER).Then([](std::uint8_t carrier) { return carrier != 0; });
  link.fAddress = AddressText(attributes.Bytes(IFLA_ADDRESS));
  link.fBroadcast = AddressText(attributes.Bytes(IFLA_BROADCAST));
  link.fPermanentAddress = AddressText(attributes.Bytes(IFLA_PERM_ADDRESS));
  link.fMtu = attributes.Number<std::uint32_t>(IFLA_MTU);
  link.fMinMtu = attributes.Number<std::uint32_t>(IFLA_MIN_MTU);
  link.fMaxMtu = attributes.Number<std::uint32_t>(IFLA_MAX_MTU);
  link.fQueueDiscipline = attributes.Text(IFLA_QDISC);
  link.fQueueLength = attributes.Number<std::uint32_t>(IFLA_TXQLEN);
  link.fSendQueues = attributes.Number<std::uint32_t>(IFLA_NUM_TX_QUEUES);
  link.fReceiveQueues = attributes.Number<std::uint32_t>(IFLA_NUM_RX_QUEUES);
  link.fPromiscuity = attributes.Number<std::uint32_t>(IFLA_PROMISCUITY);
  link.fGroup = attributes.Number<std::uint32_t>(IFLA_GROUP);
  link.fLinkMode = attributes.Number<std::uint8_t>(IFLA_LINKMODE);
  link.fCarrierChanges = attributes.Number<std::uint32_t>(IFLA_CARRIER_CHANGES);
  link.fAlias = attributes.Text(IFLA_IFALIAS);
  link.fOtherNames = OtherNamesIn(attributes.Bytes(IFLA_PROP_LIST));
  link.fKind = info.Text(IFLA_INFO_KIND);
  link.fMaster = attributes.Number<std::uint32_t>(IFLA_MASTER);
  link.fLower = LowerIn(attributes);
  link.fParentBus = attributes.Text(IFLA_PARENT_DEV_BUS_NAME);
  link.fParentDevice = attributes.Text(IFLA_PARENT_DEV_NAME);
  link.fPhysicalPort = attributes.Text(IFLA_PHYS_PORT_NAME);
  link.fCounters = CountersIn(attributes.Bytes(IFLA_STATS64));
  if (link.IsKind("vlan")) ReadVlan(link, info.Nested(IFLA_INFO_DATA));
  return link;
}

// Kernels before 5.14 do not report the device by rtnetlink. In a container, /sys may describe another network namespace.
void CompleteFromSysfs(TMachineFiles const& files, TLink& link) {
  std::string const directory = "/sys/class/net/" + link.fName;
  auto const index = files.Number<std::uint32_t>(directory + "/ifindex");
  link.fIsInSysfs = index && *link.fIndex == *index;
  if (!link.fIsInSysfs || link.fParentDevice) return;
  link.fParentDevice = files.RealName(directory + "/device");
  link.fParentBus = files.RealName(directory + "/device/subsystem");
}

}  // namespace

TFinding<std::string> AddressText(std::string_view bytes) {
  constexpr char const* kDigits = "0123456789abcdef";
  if (bytes.empty()) return TMissing{kMissingNotGiven, "the interface has no such address"};
  if (bytes.find_first_not_of('\0') == std::string_view::npos)
    return TMissing{kMissingPlaceholder, "the kernel reports an address of zeros"};
  std::string text;
  for (char const c : bytes) {
    auto const byte = static_cast<unsigned char>(c);
    text += kDigits[byte >> 4];
    text += kDigits[byte & 15];
  }
  return text;
}

TLink const* TLinks::WithIndex(TFinding<std::uint32_t> const& index) const {
  if (!index) return nullptr;
  auto const found =
      std::find_if(fAll.begin(), fAll.end(), [&](TLink const& link) { return link.fIndex && *link.fIndex == *index; });
  return found == fAll.end() ? nullptr : &*found;
}

TFinding<std::string> TLinks::NameOf(TFinding<std::uint32_t> const& index) const {
  return index.Then([&](std::uint32_t number) -> TFinding<std::string> {
    TLink const* const link = WithIndex(number);
    if (link == nullptr)
      return TMissing{kMissingUnexpected, "the kernel lists no interface with index " + std::to_string(number)};
    return link->fName;
  });
}

TLinks LinksIn(std::string const& dump) {
  TLinks links{"rtnetlink", {}, {}};
  std::set<std::string> names;
  std::size_t count = 0;
  VisitMessages<ifinfomsg>(dump, RTM_NEWLINK, [&](ifinfomsg const& header, TNetlinkAttributes const& attributes) {
    std::string const name(TextIn(attributes.Bytes(IFLA_IFNAME)));
    if (name.empty() || !names.insert(name).second) return;
    if (++count <= kInstanceLimit) links.fAll.push_back(LinkFrom(header, attributes));
  });
  if (count > kInstanceLimit) links.fWhyNotAll = WhyNotAll(std::to_string(count) + " interfaces");
  return links;
}

TLinks LinksOf(TMachineFiles const& files) {
  auto const dump = files.Answer("netlink/links", [] { return NetlinkDump(RTM_GETLINK, AF_UNSPEC); });
  if (!dump) return LinksInSysfs(files, dump.Why());
  TLinks links = LinksIn(*dump);
  for (TLink& link : links.fAll) CompleteFromSysfs(files, link);
  return links;
}

}  // namespace NQRVZEP20
