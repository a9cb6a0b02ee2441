// SPDX-License-Identifier: Apache-2.0

// LinksInSysfs: the interfaces of a machine that refuses rtnetlink.

#include "Limits.h"
#include "Link.h"

#include <linux/if.h>

#include <algorithm>
#include <cstdio>
#include <iterator>

namespace NQRVZEP20 {

namespace {

constexpr char const* kDirectory = "/sys/class/net/";

// The words of "operstate", by number.
constexpr char const* kOperStates[] = {"unknown", "notpresent", "down", "lowerlayerdown", "testing", "dormant", "up"};

TFinding<std::uint8_t> OperStateFrom(std::string const& word) {
  auto const* const found = std::find(std::begin(kOperStates), std::end(kOperStates), word);
  if (found == std::end(kOperStates)) return TMissing{kMissingUnexpected, "\"" + word + "\" is not an operational state"};
  return static_cast<std::uint8_t>(found - std::begin(kOperStates));
}

// "52:54:00:12:34:56" as AddressText returns it.
TFinding<std::string> AddressFrom(std::string text) {
  text.erase(std::remove(text.begin(), text.end(), ':'), text.end());
  if (text.find_first_not_of('0') == std::string::npos)
    return TMissing{kMissingPlaceholder, "the kernel reports an address of zeros"};
  return text;
}

TFinding<TLinkCounters> CountersIn(TMachineFiles const& files, std::string const& directory) {
  constexpr char const* kNames[] = {
      "rx_packets",     "tx_packets",          "rx_bytes",        "tx_bytes",         "rx_errors",         "tx_errors",
      "rx_dropped",     "tx_dropped",          "multicast",       "collisions",       "rx_length_errors",  "rx_over_errors",
      "rx_crc_errors",  "rx_frame_errors",     "rx_fifo_errors",  "rx_missed_errors", "tx_aborted_errors", "tx_carrier_errors",
      "tx_fifo_errors", "tx_heartbeat_errors", "tx_window_errors"};
  constexpr std::uint64_t TLinkCounters::*kMembers[] = {
      &TLinkCounters::fReceivedPackets, &TLinkCounters::fSentPackets,     &TLinkCounters::fReceivedBytes,
      &TLinkCounters::fSentBytes,       &TLinkCounters::fReceiveErrors,   &TLinkCounters::fSendErrors,
      &TLinkCounters::fReceiveDrops,    &TLinkCounters::fSendDrops,       &TLinkCounters::fMulticast,
      &TLinkCounters::fCollisions,      &TLinkCounters::fLengthErrors,    &TLinkCounters::fOverErrors,
      &TLinkCounters::fCrcErrors,       &TLinkCounters::fFrameErrors,     &TLinkCounters::fReceiveFifoErrors,
      &TLinkCounters::fMissedErrors,    &TLinkCounters::fAbortedErrors,   &TLinkCounters::fCarrierErrors,
      &TLinkCounters::fSendFifoErrors,  &TLinkCounters::fHeartbeatErrors, &TLinkCounters::fWindowErrors};
  static_assert(std::size(kNames) == std::size(kMembers));
  TLinkCounters counters = {};
  for (std::size_t i = 0; i < std::size(kNames); ++i) {
    auto const counter = files.Number<std::uint64_t>(directory + "/statistics/" + kNames[i]);
    if (!counter) return counter.Why();
    counters.*kMembers[i] = *counter;
  }
  return counters;
}

// The word after "DEVTYPE=" in the file "uevent": "bond", "bridge", "vlan", …. For a device it has another meaning: "wlan", ….
TFinding<std::string> KindIn(std::string const& uevent) {
  std::string const key = "DEVTYPE=";
  std::size_t const begin = uevent.rfind(key, 0) == 0 ? 0 : uevent.find("\n" + key);
  if (begin == std::string::npos) return TLink::WhyAbsent();
  std::size_t const value = uevent.find('=', begin) + 1;
  return uevent.substr(value, uevent.find('\n', value) - value);
}

// The index of the interface below; sysfs reports the interface's own index if it has none.
TFinding<std::uint32_t> LowerIn(TMachineFiles const& files, std::string const& directory, TFinding<std::uint32_t> const& own) {
  return files.Number<std::uint32_t>(directory + "/iflink").Then([&](std::uint32_t index) -> TFinding<std::uint32_t> {
    if (own && *own == index) return TLink::WhyAbsent();
    return index;
  });
}

// In the table /proc/net/vlan/config: "eth0.100       | 100  | eth0".
TFinding<std::uint16_t> VlanIdOf(TMachineFiles const& files, std::string const& name) {
  return files.Content("/proc/net/vlan/config").Then([&](std::string const& table) -> TFinding<std::uint16_t> {
    std::size_t const line = ("\n" + table).find("\n" + name + " ");
    unsigned id = 0;
    if (line == std::string::npos || std::sscanf(table.c_str() + line + name.size(), " | %u", &id) != 1 || id > 4095)
      return TLink::WhyAbsent();
    return static_cast<std::uint16_t>(id);
  });
}

// The values that only rtnetlink reports are missing for the reason for which rtnetlink is.
TLink LinkWithout(TMissing const& netlink) {
  TLink link;
  link.fPermanentAddress = link.fQueueDiscipline = netlink;
  link.fMinMtu = link.fMaxMtu = link.fSendQueues = link.fReceiveQueues = link.fPromiscuity = link.fVlanFlags = netlink;
  link.fVlanProtocol = netlink;
  return link;
}

TLink LinkIn(TMachineFiles const& files, std::string const& name, TMissing const& whyNotNetlink) {
  std::string const directory = kDirectory + name;
  auto const number = [&](char const* file) { return files.Number<std::uint32_t>(directory + "/" + file); };
  TLink link = LinkWithout(whyNotNetlink);
  link.fName = name;
  link.fIndex = number("ifindex");
  link.fType = files.Number<std::uint16_t>(directory + "/type");
  link.fFlags = number("flags");
  link.fOperState = files.Line(directory + "/operstate").Then(OperStateFrom);
  link.fHasCarrier = number("carrier").Then([](std::uint32_t carrier) { return carrier != 0; });
  link.fAddress = files.Line(directory + "/address").Then(AddressFrom);
  link.fBroadcast = files.Line(directory + "/broadcast").Then(AddressFrom);
  link.fMtu = number("mtu");
  link.fQueueLength = number("tx_queue_len");
  link.fGroup = number("netdev_group");
  link.fLinkMode = files.Number<std::uint8_t>(directory + "/link_mode");
  link.fCarrierChanges = number("carrier_changes");
  link.fAlias = files.Line(directory + "/ifalias");
  link.fMaster = number("master/ifindex");
  link.fLower = LowerIn(files, directory, link.fIndex);
  link.fParentDevice = files.RealName(directory + "/device");
  link.fParentBus = files.RealName(directory + "/device/subsystem");
  link.fPhysicalPort = files.Line(directory + "/phys_port_name");
  if (!link.fParentDevice) link.fKind = files.Content(directory + "/uevent").Then(KindIn);
  link.fCounters = CountersIn(files, directory);
  link.fVlanId = VlanIdOf(files, name);
  link.fIsInSysfs = true;
  return link;
}

}  // namespace

TLinks LinksInSysfs(TMachineFiles const& files, TMissing const& whyNotNetlink) {
  TLinks links{"sysfs", {}, {}};
  std::vector<std::string> const names = files.Names(kDirectory);
  for (std::string const& name : names)
    if (links.fAll.size() < kInstanceLimit && files.Exists(kDirectory + name + "/ifindex"))
      links.fAll.push_back(LinkIn(files, name, whyNotNetlink));
  std::stable_sort(links.fAll.begin(), links.fAll.end(),
                   [](TLink const& a, TLink const& b) { return (a.fIndex ? *a.fIndex : 0) < (b.fIndex ? *b.fIndex : 0); });
  if (names.empty())
    links.fWhyNotAll = TMissing{whyNotNetlink.fCode, whyNotNetlink.fReason + "; and /sys/class/net lists no interface"};
  else if (names.size() > kInstanceLimit)
    links.fWhyNotAll = WhyNotAll(std::to_string(names.size()) + " interfaces");
  return links;
}

}  // namespace NQRVZEP20
